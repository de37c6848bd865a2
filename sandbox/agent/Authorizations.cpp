#include "Authorizations.h"

#include <sodium.h>

namespace lumora::sandbox {

const std::string& Authorizations::give(const std::string& caller) {
  constexpr std::size_t length = 32;
  std::string& bytes = bytes_[caller];
  if (bytes.empty()) {
    bytes.resize(length);
    randombytes_buf(bytes.data(), bytes.size());
  }
  return bytes;
}

bool Authorizations::isGoodFor(const std::string& caller, const std::string& authorization) const {
  const auto found = bytes_.find(caller);
  return found != bytes_.end() && found->second.size() == authorization.size() &&
         sodium_memcmp(found->second.data(), authorization.data(), authorization.size()) == 0;
}

void Authorizations::forget(const std::string& caller) {
  bytes_.erase(caller);
}

} // namespace lumora::sandbox
