#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <compare>
#include <string>

namespace lumora::backend {

/// What tells one service from all others (RFC 6763, section 4.1).
struct ServiceInstance {
  std::string name;
  std::string type;
  std::string domain;

  auto operator<=>(const ServiceInstance&) const = default;
};

enum class DiscoveryErrorCode { NotAvailable = -1, TimedOut = -2, Refused = -3 };

inline LMRErrorRef discoveryError(DiscoveryErrorCode code, std::string text) {
  return LMRError::make("org.vantor.lumora.discovery", static_cast<int>(code), std::move(text));
}

} // namespace lumora::backend
