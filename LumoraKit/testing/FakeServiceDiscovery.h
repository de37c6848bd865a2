#pragma once

#include <LumoraKit/platform/ServiceDiscovery.h>

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumora::fakes {

/// A service whose resolution the test ends. One that it does not end fails when its time is over, by the platform's
/// queues. Main thread only.
class LUMORA_EXPORT FakeNetService final : public NetService, public std::enable_shared_from_this<FakeNetService> {
public:
  /// A service that is on no network; FakeServiceDiscovery::add() makes one that is.
  explicit FakeNetService(std::string name);
  ~FakeNetService() override;

  /// Ends the resolution that is under way, and tells the delegate at once; false when there is none.
  bool resolve(std::optional<TextRecord> record);
  /// The resolution that is under way fails, and the delegate is told at once; false when there is none.
  bool fail();

  /// Whether a resolution is under way.
  bool isResolving() const { return isResolving_; }
  /// The limits of the resolutions so far.
  const std::vector<std::chrono::milliseconds>& limits() const { return limits_; }

  std::string name() const override { return name_; }
  std::optional<TextRecord> textRecord() const override { return record_; }
  void setDelegate(std::weak_ptr<NetServiceDelegate> delegate) override { delegate_ = std::move(delegate); }
  void resolveWithTimeout(std::chrono::milliseconds limit) override;

private:
  const std::string name_;
  std::optional<TextRecord> record_;
  std::weak_ptr<NetServiceDelegate> delegate_;
  bool isResolving_ = false;
  std::vector<std::chrono::milliseconds> limits_;
};

/// A network whose services come and go as the test says. Main thread only.
class LUMORA_EXPORT FakeServiceDiscovery final : public ServiceDiscovery {
public:
  FakeServiceDiscovery();
  ~FakeServiceDiscovery() override;

  /// A service comes, and every search is told at once; a later search is told on a later turn.
  std::shared_ptr<FakeNetService> add(const std::string& name);
  /// A service goes, and every search is told at once.
  void remove(const std::shared_ptr<FakeNetService>& service);

  /// While false, no search can be begun.
  void setIsAvailable(bool isAvailable) { isAvailable_ = isAvailable; }

  /// The types of all searches so far.
  const std::vector<std::string>& browsedTypes() const { return browsedTypes_; }
  /// How many searches are under way.
  std::size_t browserCount() const;

  std::unique_ptr<ServiceBrowser> browse(std::string_view type, ServiceBrowserEvents events,
                                         LMRErrorRef* error) override;

private:
  class Browser;
  struct Network;

  const std::shared_ptr<Network> network_;
  std::vector<std::shared_ptr<FakeNetService>> services_;
  std::vector<std::string> browsedTypes_;
  bool isAvailable_ = true;
};

} // namespace lumora::fakes
