#pragma once

#include <LumoraKit/platform/CredentialStore.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace lumora::backend {

/// How much work it is to try a passphrase.
struct SealCost {
  std::uint64_t passes;
  std::uint64_t memory; // bytes
};

/// A key from a passphrase, and the texts that it seals. A sealed text is
///
///     header   "LMRCRED1", passes and memory (8 bytes each, least one first), salt (16), proof of the key (32),
///              BLAKE2b of all that (32)
///     body     nonce (24), XChaCha20-Poly1305 of the plain text, with the header as additional data
///
/// So a wrong passphrase is told apart from a damaged file.
class LUMORA_INTERNAL Seal {
public:
  static SealCost defaultCost();

  /// With a new salt. Nothing, with the error set, when there is too little memory.
  static std::optional<Seal> make(const Secret& passphrase, SealCost cost, LMRErrorRef& error);
  /// The one that a text was sealed with. Nothing, with the error set, for a wrong passphrase or a damaged header.
  static std::optional<Seal> of(std::string_view sealed, const Secret& passphrase, LMRErrorRef& error);

  std::string close(const Secret& plain) const;
  /// Nothing, with the error set, for what is damaged or was sealed with another seal.
  std::optional<Secret> open(std::string_view sealed, LMRErrorRef& error) const;

private:
  Seal(std::string header, Secret key) : header_(std::move(header)), key_(std::move(key)) {}

  std::string header_;
  Secret key_;
};

} // namespace lumora::backend
