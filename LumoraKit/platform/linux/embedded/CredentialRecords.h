#pragma once

#include <LumoraKit/platform/Secret.h>

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace lumora::backend {

struct CredentialRecord {
  /// Never given to another item.
  std::uint64_t number;
  std::string service;
  std::string account;
  Secret secret;
};

/// What an embedded store holds, and its plain form: the last number given (8 bytes), then for each item its number
/// (8), and service, account and secret with their lengths (4 each) before them.
struct LUMORA_INTERNAL CredentialRecords {
  std::uint64_t lastNumber = 0;
  std::vector<CredentialRecord> items;

  Secret encoded() const;
  /// Nothing for what is no such form.
  static std::optional<CredentialRecords> decoded(const Secret& plain);

  /// The first one of the kind; null when there is none.
  const CredentialRecord* find(const std::string& service, const std::string& account) const;
};

} // namespace lumora::backend
