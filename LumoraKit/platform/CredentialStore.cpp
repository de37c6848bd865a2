#include <LumoraKit/platform/CredentialStore.h>
#include <LumoraKit/platform/UnicodeText.h>

#include <utility>

namespace lumora {

CredentialStore::~CredentialStore() = default;

bool isCredentialText(std::string_view text) {
  return utf8::isValid(text) && text.find('\0') == std::string_view::npos;
}

LMRErrorRef credentialError(CredentialError code, std::string description) {
  return LMRError::make(CredentialErrorDomain, static_cast<std::int64_t>(code), std::move(description));
}

bool isCredentialError(const LMRErrorRef& error, CredentialError code) {
  return error && error->domain() == CredentialErrorDomain && error->code() == static_cast<std::int64_t>(code);
}

} // namespace lumora
