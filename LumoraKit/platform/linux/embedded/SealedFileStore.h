#pragma once

#include "CredentialRecords.h"
#include "Seal.h"

#include <LumoraKit/platform/CredentialStore.h>

#include <chrono>
#include <filesystem>
#include <functional>
#include <memory>
#include <optional>

namespace lumora::backend {

/// The embedded store; see makeEmbeddedCredentialStore().
class LUMORA_INTERNAL SealedFileStore final : public CredentialStore {
public:
  /// How long a change waits for its turn.
  static constexpr std::chrono::milliseconds defaultPatience = std::chrono::seconds(5);

  /// Null, with the error set, when there is none.
  /// \param cost of a new file
  static std::shared_ptr<SealedFileStore> open(const std::filesystem::path& file, const Secret& passphrase,
                                               SealCost cost, LMRErrorRef& error,
                                               std::chrono::milliseconds patience = defaultPatience);

  LMRErrorRef add(const std::string& service, const std::string& account, const Secret& secret) override;
  LMRErrorRef find(const std::string& service, const std::string& account, std::string* handle,
                   Secret* secret) override;
  LMRErrorRef remove(const std::string& handle) override;
  LMRErrorRef list(const std::string& service, std::vector<CredentialItem>& items) override;

  /// With the seal of that file.
  SealedFileStore(std::filesystem::path file, std::chrono::milliseconds patience, Seal seal)
      : file_(std::move(file)), patience_(patience), seal_(std::move(seal)) {}

private:
  /// Null when nothing of it went wrong, with what the file holds.
  LMRErrorRef read(CredentialRecords& records) const;
  /// Has the records changed and writes them, in its turn.
  LMRErrorRef change(const std::function<LMRErrorRef(CredentialRecords& records)>& how) const;

  const std::filesystem::path file_;
  const std::chrono::milliseconds patience_;
  const Seal seal_;
};

} // namespace lumora::backend
