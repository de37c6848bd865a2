#include "Users.h"

#include "Passwords.h"

namespace lumora::sandbox {

void addUser(Store& store, const User& user, const std::string& password) {
  store.execute("INSERT INTO users VALUES (?, ?, ?) ON CONFLICT (name) DO UPDATE SET full_name = excluded.full_name, "
                "password_hash = excluded.password_hash",
                user.name, user.fullName, hashOfPassword(password));
}

bool removeUser(Store& store, const std::string& name) {
  return store.execute("DELETE FROM users WHERE name = ?", name) > 0;
}

std::vector<User> users(Store& store) {
  std::vector<User> all;
  auto row = store.query("SELECT name, full_name FROM users ORDER BY name");
  while (row.executeStep()) {
    all.push_back({row.getColumn(0).getString(), row.getColumn(1).getString()});
  }
  return all;
}

std::optional<User> findUser(Store& store, const std::string& name) {
  auto row = store.query("SELECT full_name FROM users WHERE name = ?", name);
  return row.executeStep() ? std::optional(User{name, row.getColumn(0).getString()}) : std::nullopt;
}

std::optional<User> authenticate(Store& store, const std::string& name, const std::string& password) {
  auto row = store.query("SELECT full_name, password_hash FROM users WHERE name = ?", name);
  if (!row.executeStep() || !passwordMatches(row.getColumn(1).getString(), password)) {
    return std::nullopt;
  }
  return User{name, row.getColumn(0).getString()};
}

} // namespace lumora::sandbox
