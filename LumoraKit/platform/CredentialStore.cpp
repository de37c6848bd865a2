#include <LumoraKit/platform/CredentialStore.h>

#include <utility>

namespace lumora {

CredentialStore::~CredentialStore() = default;

LMRErrorRef credentialError(CredentialError code, std::string description) {
  return LMRError::make(CredentialErrorDomain, static_cast<std::int64_t>(code), std::move(description));
}

bool isCredentialError(const LMRErrorRef& error, CredentialError code) {
  return error && error->domain() == CredentialErrorDomain && error->code() == static_cast<std::int64_t>(code);
}

} // namespace lumora
