#pragma once

#include "SecretServiceDialogue.h"

#include <LumoraKit/platform/CredentialStore.h>

#include <filesystem>

namespace lumora::backend {

/// The credential store of the user's desktop, by the Secret Service on the bus of the user's session. Items are told
/// apart from other programs' by a schema of their own; their label is their service. New ones go into the default
/// collection, which is never made here.
///
/// No call takes longer than the deadlines: 5 seconds for the service, and up to 60 more while the user is asked to
/// unlock a collection. That protocol knows no "there is one already": items are looked for and added under a lock
/// among the user's processes.
class LUMORA_INTERNAL SecretServiceStore final : public CredentialStore {
public:
  /// \param lockFolder for the file with the lock; made when it is missing
  explicit SecretServiceStore(std::filesystem::path lockFolder, SecretServiceDeadlines deadlines = {});

  LMRErrorRef add(const std::string& service, const std::string& account, const Secret& secret) override;
  LMRErrorRef find(const std::string& service, const std::string& account, std::string* handle,
                   Secret* secret) override;
  LMRErrorRef remove(const std::string& handle) override;
  LMRErrorRef list(const std::string& service, std::vector<CredentialItem>& items) override;

private:
  const std::filesystem::path lockFolder_;
  const SecretServiceDeadlines deadlines_;
};

} // namespace lumora::backend
