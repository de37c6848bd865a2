#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <chrono>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// \file
/// Network service discovery: DNS-based (RFC 6763), as a rule over multicast DNS (RFC 6762). Main thread only.

namespace lumora {

class NetService;

/// A service's text record: the bytes of each key's value, nothing for a key without one. Keys are in small letters,
/// since their case does not count.
using TextRecord = std::map<std::string, std::optional<std::string>, std::less<>>;

/// The record of its strings "key=value" (RFC 6763, section 6.4): of a repeated key the first counts, and a string
/// without a key is left out.
LUMORA_EXPORT TextRecord textRecordWithStrings(const std::vector<std::string>& strings);

/// Whom a service tells how its resolution ended.
class LUMORA_EXPORT NetServiceDelegate {
public:
  virtual ~NetServiceDelegate();
  /// The service's address and text record are known.
  virtual void netServiceDidResolveAddress(const std::shared_ptr<NetService>& service) = 0;
  /// They could not be found out, or not within the limit; the error says why.
  virtual void netService_didNotResolve(const std::shared_ptr<NetService>& service, const LMRErrorRef& error) = 0;
};

/// One service that was discovered. It can be used for as long as it is held, also after it went away.
class LUMORA_EXPORT NetService {
public:
  virtual ~NetService();

  /// The instance's name, as it is shown to users ("Studio 3").
  virtual std::string name() const = 0;
  /// Nothing unless the service has been resolved, and has a record.
  virtual std::optional<TextRecord> textRecord() const = 0;

  /// Held weakly: one that died is not told.
  virtual void setDelegate(std::weak_ptr<NetServiceDelegate> delegate) = 0;
  /// Looks up the address and the text record, and tells the delegate once, on a later turn of the main thread: with
  /// an error when it took longer than the limit. One that is under way is begun anew. Returns at once.
  virtual void resolveWithTimeout(std::chrono::milliseconds limit) = 0;
};

/// What a browser tells of.
struct LUMORA_EXPORT ServiceBrowserEvents {
  /// A service came, or was there already.
  std::function<void(const std::shared_ptr<NetService>& service)> found;
  /// A service went; the object is the one that was told as found.
  std::function<void(const std::shared_ptr<NetService>& service)> lost;
};

/// A search under way. It ends with the object, after which nothing is told any more.
class LUMORA_EXPORT ServiceBrowser {
public:
  virtual ~ServiceBrowser();
};

/// The machine's service discovery.
class LUMORA_EXPORT ServiceDiscovery {
public:
  virtual ~ServiceDiscovery();

  /// Begins to search, and returns at once. Each service is found once, however many networks it is seen on, and lost
  /// once, when it is seen on none any more or the discovery itself is gone; both are told on later turns of the main
  /// thread, with the same object.
  /// \param type of the services ("_lumora._tcp")
  /// \param error receives why there is no discovery on this machine, with a null result; may be null
  virtual std::unique_ptr<ServiceBrowser> browse(std::string_view type, ServiceBrowserEvents events,
                                                 LMRErrorRef* error) = 0;
};

} // namespace lumora
