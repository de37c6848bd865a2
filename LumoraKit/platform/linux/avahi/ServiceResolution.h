#pragma once

#include <LumoraKit/platform/ServiceDiscovery.h>
#include <LumoraKit/platform/linux/avahi/AvahiDaemon.h>
#include <LumoraKit/platform/linux/avahi/ServiceInstance.h>

#include <chrono>
#include <functional>
#include <memory>
#include <optional>

namespace lumora::backend {

/// One look-up of a service's address and text record. On the daemon's thread, except that it may be made and destroyed
/// anywhere.
class ServiceResolution final : public AvahiDaemon::Dependent, public std::enable_shared_from_this<ServiceResolution> {
public:
  /// How it ended: told once.
  using Report = std::function<void(const LMRErrorRef& error, std::optional<TextRecord> record)>;

  ServiceResolution(ServiceInstance service, std::chrono::milliseconds limit, Report report);

  void start(AvahiDaemon& daemon);
  /// Nothing is told any more.
  void stop();

  void daemonCame() override;
  void daemonWent(const LMRErrorRef& reason) override;

private:
  static gboolean timedOut(gpointer self);
  void answered(GVariant* answer, const LMRErrorRef& error);
  void finish(const LMRErrorRef& error, std::optional<TextRecord> record);

  const ServiceInstance service_;
  const std::chrono::milliseconds limit_;
  const Report report_;
  // Null when it has ended.
  AvahiDaemon* daemon_ = nullptr;
  GLibPtr<GSource> timer_;
};

} // namespace lumora::backend
