#pragma once

#include "support/MainLoop.h"
#include "support/TestAvahi.h"

#include <LumoraKit/platform/ServiceDiscovery.h>
#include <LumoraKit/platform/linux/Backends.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

namespace lumora::tests {

/// What was told of a search, in order: "+Studio", "-Studio".
struct Listener {
  ServiceBrowserEvents events() {
    return {.found =
                [this](const auto& service) {
                  told.push_back("+" + service->name());
                  services.push_back(service);
                },
            .lost =
                [this](const auto& service) {
                  told.push_back("-" + service->name());
                  std::erase(services, service);
                }};
  }
  std::shared_ptr<NetService> service(const std::string& name) const {
    const auto found = std::ranges::find_if(services, [&](const auto& one) { return one->name() == name; });
    return found == services.end() ? nullptr : *found;
  }
  auto count(const std::string& event) const { return std::ranges::count(told, event); }

  std::vector<std::string> told;
  std::vector<std::shared_ptr<NetService>> services;
};

/// How resolutions ended: "resolved Studio", "failed Studio".
struct Resolver : NetServiceDelegate {
  void netServiceDidResolveAddress(const std::shared_ptr<NetService>& service) override {
    told.push_back("resolved " + service->name());
  }
  void netService_didNotResolve(const std::shared_ptr<NetService>& service, const LMRErrorRef& reason) override {
    told.push_back("failed " + service->name());
    error = reason;
  }

  std::vector<std::string> told;
  LMRErrorRef error;
};

/// The machine's discovery on a network of the test's own.
class DiscoveryTest : public testing::Test {
protected:
  static constexpr const char* type = "_lumora._tcp";
  static constexpr std::chrono::seconds longLimit{30};

  void SetUp() override {
    if (const auto obstacle = TestAvahi::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    startNetwork();
  }
  virtual void startNetwork() { ASSERT_TRUE(network_.start()); }

  std::unique_ptr<ServiceBrowser> browse(Listener& listener) {
    LMRErrorRef error;
    auto browser = discovery_->browse(type, listener.events(), &error);
    EXPECT_TRUE(browser) << error->description();
    return browser;
  }
  void browse() { browser_ = browse(listener_); }

  bool waitFor(const std::string& event, long times = 1) {
    return serveUntil([&] { return listener_.count(event) >= times; });
  }
  /// The service, as soon as it is found.
  std::shared_ptr<NetService> find(const std::string& name) {
    EXPECT_TRUE(serveUntil([&] { return listener_.service(name) != nullptr; })) << name;
    return listener_.service(name);
  }
  /// Resolves it, and waits for the end.
  void resolve(const std::shared_ptr<NetService>& service, std::chrono::milliseconds limit = longLimit) {
    service->setDelegate(resolver_);
    const auto before = resolver_->told.size();
    service->resolveWithTimeout(limit);
    EXPECT_TRUE(serveUntil([&] { return resolver_->told.size() > before; }));
  }

  TestAvahi network_;
  std::shared_ptr<ServiceDiscovery> discovery_ = backend::makeServiceDiscovery();
  Listener listener_;
  std::unique_ptr<ServiceBrowser> browser_;
  std::shared_ptr<Resolver> resolver_ = std::make_shared<Resolver>();
};

} // namespace lumora::tests
