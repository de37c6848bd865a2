#pragma once

#include <LumoraKit/platform/CredentialStore.h>

#include <cstddef>
#include <cstdint>
#include <deque>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace lumora::fakes {

/// What a credential store is asked to do.
enum class CredentialOperation { Add, Find, Remove, List };

/// One call of a credential store, as it was asked for.
struct CredentialCall {
  /// Which operation was called.
  CredentialOperation operation;
  /// Empty for Remove.
  std::string service;
  /// Empty for Remove and List.
  std::string account;

  bool operator==(const CredentialCall&) const = default;
};

/// An item as it is stored. The secret is plain, so that a test can compare it.
struct StoredCredential {
  /// The item's service.
  std::string service;
  /// The item's account.
  std::string account;
  /// The item's secret.
  std::string secret;

  bool operator==(const StoredCredential&) const = default;
};

/// A credential store in memory, with the rules of a real one. Keeps every call. Any thread.
///
///     platform.credentialStore->put("Lumora: studio.example.org", "ada", "apple");
///     platform.credentialStore->failOnce(CredentialOperation::Add, lumora::CredentialError::Locked);
class LUMORA_EXPORT FakeCredentialStore final : public CredentialStore {
public:
  FakeCredentialStore();
  ~FakeCredentialStore() override;

  /// Stores an item as another program would, without a call and without a check: also a second one of the same service
  /// and account.
  void put(std::string service, std::string account, std::string secret);
  /// The items, in the order in which they were added.
  std::vector<StoredCredential> items() const;
  /// The secret of the first item of this service and account.
  std::optional<std::string> secret(const std::string& service, const std::string& account) const;

  /// Every such call fails with this error and does nothing, until it is set to none.
  void fail(CredentialOperation operation, std::optional<CredentialError> error);
  /// One such call fails; several are given in their order, before the standing one.
  void failOnce(CredentialOperation operation, CredentialError error);
  /// The account and the secret of this item cannot be read: finding its secret fails, and it is listed with the error.
  void failToRead(const std::string& service, const std::string& account, CredentialError error);

  /// The calls so far, in the order of their arrival.
  std::vector<CredentialCall> calls() const;
  /// How many calls there were.
  std::size_t callCount() const;
  /// Empties the list of calls.
  void forgetCalls();

  LMRErrorRef add(const std::string& service, const std::string& account, const Secret& secret) override;
  LMRErrorRef find(const std::string& service, const std::string& account, std::string* handle,
                   Secret* secret) override;
  LMRErrorRef remove(const std::string& handle) override;
  LMRErrorRef list(const std::string& service, std::vector<CredentialItem>& items) override;

private:
  struct Script {
    std::deque<CredentialError> once;
    std::optional<CredentialError> standing;
  };
  struct Item {
    std::uint64_t number = 0;
    StoredCredential content;
  };

  LMRErrorRef begin(CredentialCall call);
  const Item* first(const std::string& service, const std::string& account) const;
  LMRErrorRef readError(const StoredCredential& item) const;

  mutable std::mutex mutex_;
  std::vector<Item> items_;
  std::uint64_t lastNumber_ = 0;
  std::map<CredentialOperation, Script> scripts_;
  std::map<std::pair<std::string, std::string>, CredentialError> unreadable_;
  std::vector<CredentialCall> calls_;
};

} // namespace lumora::fakes
