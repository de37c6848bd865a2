#include "Users.h"

#include <sodium.h>

#include <array>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

// The least that the algorithm allows: every tool run checks a password, and this is no place for real secrets.
constexpr unsigned long long operations = crypto_pwhash_argon2id_OPSLIMIT_MIN;
constexpr std::size_t memory = crypto_pwhash_argon2id_MEMLIMIT_MIN;

std::string hashOf(const std::string& password) {
  std::array<char, crypto_pwhash_STRBYTES> hash{};
  if (sodium_init() < 0 || crypto_pwhash_str(hash.data(), password.data(), password.size(), operations, memory) != 0) {
    throw std::runtime_error("the password could not be hashed");
  }
  return hash.data();
}

bool matches(const std::string& hash, const std::string& password) {
  return sodium_init() >= 0 && crypto_pwhash_str_verify(hash.c_str(), password.data(), password.size()) == 0;
}

} // namespace

void addUser(Store& store, const User& user, const std::string& password) {
  store.execute("INSERT INTO users VALUES (?, ?, ?) ON CONFLICT (name) DO UPDATE SET full_name = excluded.full_name, "
                "password_hash = excluded.password_hash",
                user.name, user.fullName, hashOf(password));
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
  if (!row.executeStep() || !matches(row.getColumn(1).getString(), password)) {
    return std::nullopt;
  }
  return User{name, row.getColumn(0).getString()};
}

} // namespace lumora::sandbox
