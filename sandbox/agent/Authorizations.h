#pragma once

#include <map>
#include <string>

namespace lumora::sandbox {

/// The authorizations that were handed out: one for each caller, good for that caller only and until it leaves the bus.
class Authorizations {
public:
  /// The caller's authorization, opaque bytes; the same one each time.
  const std::string& give(const std::string& caller);
  bool isGoodFor(const std::string& caller, const std::string& authorization) const;
  void forget(const std::string& caller);

private:
  std::map<std::string, std::string> bytes_;
};

} // namespace lumora::sandbox
