#pragma once

#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/platform/linux/DBusCall.h>
#include <LumoraKit/platform/linux/screencast/ScreenCast.h>

namespace lumora::backend {

/// The screens of a Wayland desktop, which its portal shows to a program that the user allows it:
/// org.freedesktop.portal.ScreenCast on the session bus. One connection serves the application for its life, because
/// a portal remembers the user's answer for one connection. When the bus or the portal is lost, the screens in
/// progress end, and the next one connects again. Any thread.
class LUMORA_INTERNAL ScreenCastPortal : public std::enable_shared_from_this<ScreenCastPortal> {
public:
  /// What a portal may take for each step in which the user has no part.
  static constexpr std::chrono::milliseconds stepDeadline = std::chrono::seconds(3);
  /// check() gives a portal the time to be started by the bus.
  static constexpr std::chrono::milliseconds checkDeadline = std::chrono::seconds(4);

  explicit ScreenCastPortal(std::shared_ptr<Queues> queues, std::chrono::milliseconds stepLimit = stepDeadline);

  /// Whether the desktop offers screens; asks nobody. Blocks for 4 seconds at most. Null if so.
  LMRErrorRef check();
  /// Begins to ask for a screen.
  std::shared_ptr<ScreenCast> open();

  /// For ScreenCast. Blocks for as long as a step; null on failure.
  std::shared_ptr<DBusLink> link(LMRErrorRef& error);
  std::chrono::milliseconds stepLimit() const { return stepLimit_; }
  /// The token of the last screen, with which the user is not asked again; it serves once.
  std::string takeRestoreToken();
  void keepRestoreToken(const std::string& token);

private:
  std::shared_ptr<DBusLink> sharedLink(std::shared_ptr<DBusLink> replacement);
  LMRErrorRef learn();

  const std::shared_ptr<Queues> queues_;
  const std::chrono::milliseconds stepLimit_;
  std::mutex mutex_;
  std::shared_ptr<DBusLink> link_;
  std::string restoreToken_;
};

} // namespace lumora::backend
