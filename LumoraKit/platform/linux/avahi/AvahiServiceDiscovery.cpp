#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/UnicodeText.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/avahi/AvahiNetService.h>
#include <LumoraKit/platform/linux/avahi/ServiceSearch.h>
#include <LumoraKit/platform/linux/avahi/SystemBusProbe.h>

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <utility>

// The daemon is reached over the system bus from a thread of our own, so that nothing waits for bus or daemon and the
// main thread may be served by any loop. Searches and resolutions live there; services and browsers live here, and
// what happens there is posted to them. Either side may go at any time: the main side is told weakly, and what it
// leaves behind is stopped over there.

namespace lumora::backend {
namespace {

class AvahiBrowser final : public ServiceBrowser {
public:
  AvahiBrowser(std::shared_ptr<AvahiLink> link, std::string type, ServiceBrowserEvents events);
  ~AvahiBrowser() override;

private:
  // What is found at the moment. While its owner is told of something, it may die.
  struct Listing {
    void found(const ServiceInstance& instance);
    void lost(const ServiceInstance& instance);

    const std::shared_ptr<AvahiLink> link;
    const ServiceBrowserEvents events;
    std::map<ServiceInstance, std::shared_ptr<AvahiNetService>> services;
  };
  using Change = void (Listing::*)(const ServiceInstance& instance);

  static std::function<void(const ServiceInstance& instance)> posting(const std::shared_ptr<Listing>& listing,
                                                                      Change change);
  static std::shared_ptr<ServiceSearch> searchFor(std::string type, const std::shared_ptr<Listing>& listing);

  const std::shared_ptr<Listing> listing_;
  const std::shared_ptr<ServiceSearch> search_;
};

AvahiBrowser::AvahiBrowser(std::shared_ptr<AvahiLink> link, std::string type, ServiceBrowserEvents events)
    : listing_(std::make_shared<Listing>(Listing{std::move(link), std::move(events), {}})),
      search_(searchFor(std::move(type), listing_)) {
  listing_->link->post([search = search_](AvahiDaemon& daemon) { search->start(daemon); });
}

AvahiBrowser::~AvahiBrowser() {
  listing_->link->post([search = search_](AvahiDaemon&) { search->stop(); });
}

std::function<void(const ServiceInstance& instance)> AvahiBrowser::posting(const std::shared_ptr<Listing>& listing,
                                                                           Change change) {
  return [weak = std::weak_ptr(listing), change](const ServiceInstance& instance) {
    Platform::current().mainThread->post([weak, change, instance] {
      if (const auto living = weak.lock()) {
        ((*living).*change)(instance);
      }
    });
  };
}

std::shared_ptr<ServiceSearch> AvahiBrowser::searchFor(std::string type, const std::shared_ptr<Listing>& listing) {
  ServiceSearch::Events events;
  events.found = posting(listing, &Listing::found);
  events.lost = posting(listing, &Listing::lost);
  return std::make_shared<ServiceSearch>(std::move(type), std::move(events));
}

void AvahiBrowser::Listing::found(const ServiceInstance& instance) {
  const auto service = std::make_shared<AvahiNetService>(link, instance);
  services[instance] = service;
  events.found(service);
}

void AvahiBrowser::Listing::lost(const ServiceInstance& instance) {
  const auto known = services.extract(instance);
  if (!known.empty()) {
    events.lost(known.mapped());
  }
}

class AvahiServiceDiscovery final : public ServiceDiscovery {
public:
  std::unique_ptr<ServiceBrowser> browse(std::string_view type, ServiceBrowserEvents events,
                                         LMRErrorRef* error) override;

private:
  std::shared_ptr<AvahiLink> link(std::string& obstacle);

  // Of all searches and services that there are.
  std::weak_ptr<AvahiLink> link_;
};

std::unique_ptr<ServiceBrowser> AvahiServiceDiscovery::browse(std::string_view type, ServiceBrowserEvents events,
                                                              LMRErrorRef* error) {
  std::string obstacle;
  auto way = utf8::isValid(type) ? link(obstacle) : nullptr;
  if (way) {
    return std::make_unique<AvahiBrowser>(std::move(way), std::string(type), std::move(events));
  }
  if (error) {
    *error = discoveryError(DiscoveryErrorCode::NotAvailable,
                            obstacle.empty() ? format("There is no service type '%@'", {text(type)}) : obstacle);
  }
  return nullptr;
}

std::shared_ptr<AvahiLink> AvahiServiceDiscovery::link(std::string& obstacle) {
  auto existing = link_.lock();
  if (existing) {
    return existing;
  }
  obstacle = systemBusObstacle();
  if (!obstacle.empty()) {
    return nullptr;
  }
  existing = AvahiLink::open();
  link_ = existing;
  obstacle = existing ? "" : "There is no thread for service discovery";
  return existing;
}

} // namespace

std::shared_ptr<ServiceDiscovery> makeServiceDiscovery() {
  return std::make_shared<AvahiServiceDiscovery>();
}

} // namespace lumora::backend
