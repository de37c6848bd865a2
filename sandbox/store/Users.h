#pragma once

#include "Store.h"

#include <vector>

/// \file
/// Who may log in. Passwords are kept as Argon2id hashes only.

namespace lumora::sandbox {

struct User {
  std::string name;
  std::string fullName;
};

/// Adds a user, or gives one that is there another password and full name.
void addUser(Store& store, const User& user, const std::string& password);
/// False when there is no such user.
bool removeUser(Store& store, const std::string& name);
std::vector<User> users(Store& store);
std::optional<User> findUser(Store& store, const std::string& name);
/// The user, when the password is right.
std::optional<User> authenticate(Store& store, const std::string& name, const std::string& password);

} // namespace lumora::sandbox
