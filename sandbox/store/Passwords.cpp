#include "Passwords.h"

#include <sodium.h>

#include <array>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

// The least that the algorithm allows: every tool run checks a password, and this is no place for real secrets.
constexpr unsigned long long operations = crypto_pwhash_argon2id_OPSLIMIT_MIN;
constexpr std::size_t memory = crypto_pwhash_argon2id_MEMLIMIT_MIN;

} // namespace

std::string hashOfPassword(const std::string& password) {
  std::array<char, crypto_pwhash_STRBYTES> hash{};
  if (sodium_init() < 0 || crypto_pwhash_str(hash.data(), password.data(), password.size(), operations, memory) != 0) {
    throw std::runtime_error("the password could not be hashed");
  }
  return hash.data();
}

bool passwordMatches(const std::string& hash, const std::string& password) {
  return sodium_init() >= 0 && crypto_pwhash_str_verify(hash.c_str(), password.data(), password.size()) == 0;
}

} // namespace lumora::sandbox
