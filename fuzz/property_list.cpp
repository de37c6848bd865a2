#include "Require.h"

#include <LumoraKit/platform/PropertyList.h>

#include <cstdint>

/// \file
/// Feeds any bytes to the property-list reader. What it reads and writes again must read the same.

namespace {

void requireRefusal(const LMRErrorRef& error, std::size_t size) {
  require(error && error->domain() == lumora::PropertyListErrorDomain);
  const lumora::Value* const byte = error->userInfo().find("byte");
  require(byte && byte->unsignedInteger() && *byte->unsignedInteger() <= size);
}

void requireRoundTrip(const lumora::Value& value) {
  const std::optional<std::string> written = lumora::xmlDescription(value);
  require(written.has_value());
  const std::optional<lumora::Value> again = lumora::valueWithXMLDescription(*written);
  require(again && *again == value);
  // Equality leaves the order of keys open; the text does not.
  require(lumora::xmlDescription(*again) == written);
  require(lumora::Value(*again) == value);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
  const std::string text(bytes, bytes + size);
  LMRErrorRef error;
  const std::optional<lumora::Value> value = lumora::valueWithXMLDescription(text, &error);
  const bool isDictionary = value && value->dictionary();
  require(lumora::dictionaryWithXMLDescription(text).has_value() == isDictionary);
  if (value) {
    require(error == nullptr);
    requireRoundTrip(*value);
  } else {
    requireRefusal(error, size);
  }
  return 0;
}
