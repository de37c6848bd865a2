#include <LumoraKit/platform/ServiceDiscovery.h>

#include <algorithm>

namespace lumora {
namespace {

// Keys are ASCII; the locale must have no say.
char smallLetter(char letter) {
  return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
}

} // namespace

NetServiceDelegate::~NetServiceDelegate() = default;
NetService::~NetService() = default;
ServiceBrowser::~ServiceBrowser() = default;
ServiceDiscovery::~ServiceDiscovery() = default;

TextRecord textRecordWithStrings(const std::vector<std::string>& strings) {
  TextRecord record;
  for (const std::string& string : strings) {
    const auto equals = string.find('=');
    std::string key = string.substr(0, equals);
    std::ranges::transform(key, key.begin(), smallLetter);
    if (!key.empty()) {
      record.try_emplace(std::move(key),
                         equals == std::string::npos ? std::nullopt : std::optional(string.substr(equals + 1)));
    }
  }
  return record;
}

} // namespace lumora
