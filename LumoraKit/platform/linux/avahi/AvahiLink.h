#pragma once

#include <LumoraKit/platform/linux/GLibThread.h>
#include <LumoraKit/platform/linux/avahi/AvahiDaemon.h>

#include <functional>
#include <memory>

namespace lumora::backend {

/// The way from the main thread to the daemon, which has a thread of its own for as long as anything needs it.
class AvahiLink {
public:
  using Work = std::function<void(AvahiDaemon& daemon)>;

  /// Null when the machine has no more threads.
  static std::shared_ptr<AvahiLink> open();

  explicit AvahiLink(std::unique_ptr<GLibThread> thread);
  AvahiLink(const AvahiLink&) = delete;
  AvahiLink& operator=(const AvahiLink&) = delete;
  ~AvahiLink();

  /// Runs it on the daemon's thread. Returns at once.
  void post(Work work);

private:
  const std::unique_ptr<GLibThread> thread_;
  const std::shared_ptr<AvahiDaemon> daemon_;
};

} // namespace lumora::backend
