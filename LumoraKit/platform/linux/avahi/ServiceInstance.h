#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <string>
#include <tuple>
#include <utility>

namespace lumora::backend {

/// What tells one service from all others (RFC 6763, section 4.1).
struct ServiceInstance {
  std::string name;
  std::string type;
  std::string domain;

  bool operator==(const ServiceInstance&) const = default;
  bool operator<(const ServiceInstance& other) const {
    return std::tie(name, type, domain) < std::tie(other.name, other.type, other.domain);
  }
};

enum class DiscoveryErrorCode { NotAvailable = -1, TimedOut = -2, Refused = -3 };

inline LMRErrorRef discoveryError(DiscoveryErrorCode code, std::string text) {
  return LMRError::make("org.vantor.lumora.discovery", static_cast<int>(code), std::move(text));
}

} // namespace lumora::backend
