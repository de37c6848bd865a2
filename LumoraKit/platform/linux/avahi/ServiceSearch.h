#pragma once

#include <LumoraKit/platform/linux/avahi/AvahiDaemon.h>
#include <LumoraKit/platform/linux/avahi/Sightings.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace lumora::backend {

/// One search for a type of service, begun again with every daemon. On the daemon's thread, except that it may be made
/// and destroyed anywhere.
class ServiceSearch final : public AvahiDaemon::Dependent, public std::enable_shared_from_this<ServiceSearch> {
public:
  /// Whom to tell of each service: once when it comes, once when it goes.
  struct Events {
    std::function<void(const ServiceInstance& service)> found;
    std::function<void(const ServiceInstance& service)> lost;
  };

  ServiceSearch(std::string type, Events events);

  void start(AvahiDaemon& daemon);
  /// Nothing is told any more.
  void stop();

  void daemonCame() override;
  void daemonWent(const LMRErrorRef& reason) override;

private:
  void follow(const std::string& path);
  void added(GVariant& arguments);
  void removed(GVariant& arguments);
  void failed(const std::string& reason);
  void loseAll();

  const std::string type_;
  const Events events_;
  AvahiDaemon* daemon_ = nullptr;
  Sightings sightings_;
  // The daemon's object for this search; empty while it has none.
  std::string path_;
  std::vector<std::unique_ptr<DBusSubscription>> subscriptions_;
};

} // namespace lumora::backend
