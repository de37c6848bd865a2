#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/Log.h>

#include <system_error>
#include <utility>

using lumora::format;
using lumora::text;

LMRError::LMRError(std::string domain, std::int64_t code, lumora::Dictionary userInfo)
    : domain_(std::move(domain)), code_(code), userInfo_(std::move(userInfo)) {}

LMRErrorRef LMRError::make(std::string_view domain, std::int64_t code, std::string localizedDescription) {
  return std::make_shared<LMRError>(
      std::string(domain), code,
      lumora::Dictionary{{std::string(LMRLocalizedDescriptionKey), std::move(localizedDescription)}});
}

LMRErrorRef LMRError::fromErrno(int errorNumber, std::string_view what) {
  const std::string reason = std::generic_category().message(errorNumber);
  return make(LMRPosixErrorDomain, errorNumber, format("%@: %@", {text(what), reason}));
}

std::string LMRError::localizedDescription() const {
  if (const auto description = userInfo_.string(LMRLocalizedDescriptionKey)) {
    return *description;
  }
  return format("Error %ld in %@", {text(code_), domain_});
}

std::string LMRError::description() const {
  return format("%@ %ld: %@", {domain_, text(code_), localizedDescription()});
}
