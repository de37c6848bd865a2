#pragma once

#include <LumoraKit/platform/ServiceDiscovery.h>
#include <LumoraKit/platform/linux/avahi/AvahiLink.h>
#include <LumoraKit/platform/linux/avahi/ServiceResolution.h>

#include <memory>
#include <optional>
#include <string>

namespace lumora::backend {

/// A service that the daemon told of. Main thread only.
class AvahiNetService final : public NetService, public std::enable_shared_from_this<AvahiNetService> {
public:
  AvahiNetService(std::shared_ptr<AvahiLink> link, ServiceInstance instance);
  ~AvahiNetService() override;

  std::string name() const override { return instance_.name; }
  std::optional<TextRecord> textRecord() const override { return record_; }
  void setDelegate(std::weak_ptr<NetServiceDelegate> delegate) override { delegate_ = std::move(delegate); }
  void resolveWithTimeout(std::chrono::milliseconds limit) override;

private:
  void stopResolution();
  void ended(const LMRErrorRef& error, const std::optional<TextRecord>& record);

  const std::shared_ptr<AvahiLink> link_;
  const ServiceInstance instance_;
  std::weak_ptr<NetServiceDelegate> delegate_;
  std::optional<TextRecord> record_;
  // The one under way.
  std::shared_ptr<ServiceResolution> resolution_;
  // How many there have been.
  unsigned number_ = 0;
};

} // namespace lumora::backend
