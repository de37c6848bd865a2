#include "MasterPassword.h"

#include "../Status.h"
#include "Passwords.h"

namespace lumora::sandbox {

namespace {

constexpr const char* key = "master_password_hash";

} // namespace

void setMasterPassword(Store& store, const std::string& password) {
  store.setSetting(key, hashOfPassword(password));
}

void checkMasterPassword(Store& store, const std::optional<std::string>& password, bool isRequired) {
  const auto hash = store.setting(key);
  if (password && hash && !passwordMatches(*hash, *password)) {
    throw Refusal(Status::NotAuthorized, "the master password is wrong");
  }
  if (isRequired && !hash) {
    throw Refusal(Status::NotAuthorized, "the workflow is protected, and this server has no master password");
  }
  if (isRequired && !password) {
    throw Refusal(Status::NotAuthorized, "the workflow is protected: the master password is needed");
  }
}

} // namespace lumora::sandbox
