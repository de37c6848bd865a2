#include <LumoraKit/login/LMRFrameworkUserDefaults.h>
#include <LumoraKit/login/LMRKeychainAccess.h>
#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/platform/CredentialStore.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/UnicodeText.h>

#include <vector>

using lumora::CredentialError;
using lumora::CredentialItem;
using lumora::CredentialStore;
using lumora::Dictionary;
using lumora::Secret;

namespace {

CredentialStore& store() {
  return *lumora::Platform::current().credentialStore;
}

bool isEmpty(const std::optional<std::string>& text) {
  return !text || text->empty();
}

std::string serviceName(const std::string& server) {
  return lumora::format(LMServiceNameFormat, {server});
}

LMRErrorRef removeItem(const std::string& service, const std::string& account) {
  std::string handle;
  const LMRErrorRef error = store().find(service, account, &handle, nullptr);
  return error ? error : store().remove(handle);
}

} // namespace

std::optional<std::string> LMRKeychainAccess::passwordForUserName_server(const std::optional<std::string>& userName,
                                                                         const std::optional<std::string>& server) {
  Secret secret{std::string()};
  if (isEmpty(userName) || isEmpty(server) || store().find(serviceName(*server), *userName, nullptr, &secret)) {
    return std::nullopt;
  }
  return lumora::utf8::isValid(secret.text()) ? std::optional(secret.text()) : std::nullopt;
}

void LMRKeychainAccess::storePassword_forUserName_server(const std::optional<std::string>& password,
                                                         const std::optional<std::string>& userName,
                                                         const std::optional<std::string>& server) {
  if (isEmpty(userName) || isEmpty(server)) {
    return;
  }
  const std::string service = serviceName(*server);
  const Secret secret(password.value_or(""));
  const LMRErrorRef error = store().add(service, *userName, secret);
  if (lumora::isCredentialError(error, CredentialError::DuplicateItem) && !removeItem(service, *userName)) {
    store().add(service, *userName, secret);
  }
}

void LMRKeychainAccess::removePasswordForUserName_server(const std::optional<std::string>& userName,
                                                         const std::optional<std::string>& server) {
  if (!isEmpty(userName) && !isEmpty(server)) {
    removeItem(serviceName(*server), *userName);
  }
}

std::optional<lumora::Array> LMRKeychainAccess::credentialsForServer(const std::optional<std::string>& server) {
  if (isEmpty(server)) {
    return std::nullopt;
  }
  std::vector<CredentialItem> items;
  // Without an answer there are no items, which is all that the caller wants to know.
  store().list(serviceName(*server), items);
  lumora::Array credentials;
  for (const CredentialItem& item : items) {
    const std::string& password = item.secret.text();
    if (item.error) {
      lumora::log("Reading the account and the password of a keychain item failed: %ld",
                  {lumora::text(item.error->code())});
    } else if (!item.account.empty() && !password.empty() && lumora::utf8::isValid(item.account) &&
               lumora::utf8::isValid(password)) {
      credentials.emplace_back(Dictionary{{std::string(LMRCredentialUserNameKey), item.account},
                                          {std::string(LMRCredentialPasswordKey), password}});
    }
  }
  return credentials;
}

std::optional<std::string> LMRKeychainAccess::mostRecentUserNameForServer(const std::optional<std::string>& server) {
  const auto defaults = LMRFrameworkUserDefaults::standardFrameworkUserDefaults();
  const auto recent = defaults->objectForKey(LMRRecentConnectionsKey);
  const Dictionary* const servers = recent ? recent->dictionary() : nullptr;
  const Dictionary* const connection = servers && server ? servers->dictionary(*server) : nullptr;
  return connection ? connection->string(LMRSavedConnectionUserNameKey) : std::nullopt;
}
