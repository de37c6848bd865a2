#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/Secret.h>

#include <string>
#include <string_view>
#include <vector>

/// \file
/// The user's credential store (the keychain): passwords by service and account.

namespace lumora {

/// Domain of the errors of a credential store.
inline constexpr std::string_view CredentialErrorDomain = "org.vantor.lumora.credentials";

/// Why a credential store did not do what it was asked for (the code of the error).
enum class CredentialError {
  /// There is an item of this service and account already.
  DuplicateItem = -25299,
  /// There is no such item, or no longer.
  ItemNotFound = -1,
  /// There is no credential store, or it was lost before it answered.
  NotAvailable = -2,
  /// The user has no default collection that a new item could go into.
  NoDefaultCollection = -3,
  /// What is asked for is locked, and it was not unlocked: the user refused, or nobody could be asked.
  Locked = -4,
  /// The store did not answer within the deadline. Whether it did what it was asked for is not known.
  TimedOut = -5,
  /// The service or the account is not a text that the store can keep: invalid UTF-8, or a null character.
  UnusableText = -6,
  /// An embedded store is sealed with another passphrase.
  WrongPassphrase = -7,
  /// What the store holds cannot be understood; an embedded store's file is damaged or cut off.
  Damaged = -8,
  /// The store refused, or failed, for a reason that the description holds.
  Failed = -9,
};

/// One password item, as it was found.
struct LUMORA_EXPORT CredentialItem {
  /// The store's own name for the item; of no meaning to anybody else.
  std::string handle;
  /// Why account and secret could not be read; null when they were.
  LMRErrorRef error = nullptr;
  /// The account that the item belongs to; empty when it could not be read.
  std::string account = {};
  /// Any bytes.
  Secret secret = Secret(std::string());
};

/// Generic password items of the current user. An item has a service, an account and a secret; no two have the same
/// service and account. Services and accounts are UTF-8 without null characters. Any thread, several at once; blocks,
/// for no longer than the deadline that each implementation documents.
class LUMORA_EXPORT CredentialStore {
public:
  virtual ~CredentialStore();

  /// Adds an item. Null on success; CredentialError::DuplicateItem when there is one of this service and account.
  virtual LMRErrorRef add(const std::string& service, const std::string& account, const Secret& secret) = 0;

  /// Looks up the first item of this service and account; CredentialError::ItemNotFound when there is none.
  /// \param handle where to put what remove() takes; may be null
  /// \param secret where to put the secret; null: it is not read, and nobody is asked to unlock it
  virtual LMRErrorRef find(const std::string& service, const std::string& account, std::string* handle,
                           Secret* secret) = 0;

  /// Removes an item by its handle; CredentialError::ItemNotFound when it is there no longer.
  virtual LMRErrorRef remove(const std::string& handle) = 0;

  /// Reads all items of a service, in the store's order. An item that cannot be read is listed with its error.
  /// \param items where to put them; empty after a failure
  virtual LMRErrorRef list(const std::string& service, std::vector<CredentialItem>& items) = 0;
};

/// Whether a store can keep the text as a service or an account.
LUMORA_EXPORT bool isCredentialText(std::string_view text);

/// An error of a credential store.
LUMORA_EXPORT LMRErrorRef credentialError(CredentialError code, std::string description);

/// Whether it is this error of a credential store; false for null.
LUMORA_EXPORT bool isCredentialError(const LMRErrorRef& error, CredentialError code);

} // namespace lumora
