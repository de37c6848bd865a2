#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/testing/FakeServiceDiscovery.h>

#include <algorithm>
#include <utility>

namespace lumora::fakes {

FakeNetService::FakeNetService(std::string name) : name_(std::move(name)) {}
FakeNetService::~FakeNetService() = default;

void FakeNetService::resolveWithTimeout(std::chrono::milliseconds limit) {
  limits_.push_back(limit);
  isResolving_ = true;
  const auto& queues = Platform::current().queues;
  queues->runAfter(limit, queues->mainQueue(), [weak = weak_from_this(), number = limits_.size()] {
    const auto self = weak.lock();
    if (self && self->limits_.size() == number) {
      self->fail();
    }
  });
}

bool FakeNetService::resolve(std::optional<TextRecord> record) {
  if (!std::exchange(isResolving_, false)) {
    return false;
  }
  record_ = std::move(record);
  if (const auto delegate = delegate_.lock()) {
    delegate->netServiceDidResolveAddress(shared_from_this());
  }
  return true;
}

bool FakeNetService::fail() {
  if (!std::exchange(isResolving_, false)) {
    return false;
  }
  if (const auto delegate = delegate_.lock()) {
    delegate->netService_didNotResolve(shared_from_this(),
                                       LMRError::make("org.vantor.lumora.discovery", -2, "No answer in time"));
  }
  return true;
}

// Who searches. A browser that dies takes itself off, also while one is told.
struct FakeServiceDiscovery::Network {
  using Event = std::function<void(const std::shared_ptr<NetService>&)> ServiceBrowserEvents::*;

  void tell(Event event, const std::shared_ptr<NetService>& service) const;
  void tell(Browser* browser, Event event, const std::shared_ptr<NetService>& service) const;

  std::vector<Browser*> browsers;
};

class FakeServiceDiscovery::Browser final : public ServiceBrowser {
public:
  Browser(std::shared_ptr<Network> network, ServiceBrowserEvents toldEvents)
      : events(std::move(toldEvents)), network_(std::move(network)) {
    network_->browsers.push_back(this);
  }
  ~Browser() override { std::erase(network_->browsers, this); }

  const ServiceBrowserEvents events;

private:
  const std::shared_ptr<Network> network_;
};

void FakeServiceDiscovery::Network::tell(Event event, const std::shared_ptr<NetService>& service) const {
  for (Browser* const browser : std::vector(browsers)) {
    tell(browser, event, service);
  }
}

void FakeServiceDiscovery::Network::tell(Browser* browser, Event event,
                                         const std::shared_ptr<NetService>& service) const {
  if (std::ranges::find(browsers, browser) != browsers.end()) {
    (browser->events.*event)(service);
  }
}

FakeServiceDiscovery::FakeServiceDiscovery() : network_(std::make_shared<Network>()) {}
FakeServiceDiscovery::~FakeServiceDiscovery() = default;

std::shared_ptr<FakeNetService> FakeServiceDiscovery::add(const std::string& name) {
  auto service = std::make_shared<FakeNetService>(name);
  services_.push_back(service);
  network_->tell(&ServiceBrowserEvents::found, service);
  return service;
}

void FakeServiceDiscovery::remove(const std::shared_ptr<FakeNetService>& service) {
  std::erase(services_, service);
  network_->tell(&ServiceBrowserEvents::lost, service);
}

std::size_t FakeServiceDiscovery::browserCount() const {
  return network_->browsers.size();
}

std::unique_ptr<ServiceBrowser> FakeServiceDiscovery::browse(std::string_view type, ServiceBrowserEvents events,
                                                             LMRErrorRef* error) {
  if (!isAvailable_) {
    if (error) {
      *error = LMRError::make("org.vantor.lumora.discovery", -1, "There is no service discovery");
    }
    return nullptr;
  }
  browsedTypes_.emplace_back(type);
  auto browser = std::make_unique<Browser>(network_, std::move(events));
  for (const auto& service : services_) {
    Platform::current().mainThread->post([network = network_, service, browser = browser.get()] {
      network->tell(browser, &ServiceBrowserEvents::found, service);
    });
  }
  return browser;
}

} // namespace lumora::fakes
