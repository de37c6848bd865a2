#include "Require.h"

#include <LumoraKit/platform/ServiceDiscovery.h>

#include <algorithm>
#include <cstdint>

/// \file
/// Takes any bytes for the data of a text record: strings with a byte of length before each (RFC 6763, section 6.1).

namespace {

std::vector<std::string> stringsIn(std::string_view data) {
  std::vector<std::string> strings;
  while (!data.empty()) {
    const auto length = static_cast<std::uint8_t>(data.front());
    strings.emplace_back(data.substr(1, length));
    data.remove_prefix(std::min<std::size_t>(data.size(), std::size_t{1} + length));
  }
  return strings;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
  const auto strings = stringsIn({reinterpret_cast<const char*>(bytes), size});
  const auto record = lumora::textRecordWithStrings(strings);
  require(record.size() <= strings.size());
  for (const auto& [key, value] : record) {
    require(!key.empty() && key.find('=') == std::string::npos);
    require(std::ranges::none_of(key, [](char letter) { return letter >= 'A' && letter <= 'Z'; }));
  }
  return 0;
}
