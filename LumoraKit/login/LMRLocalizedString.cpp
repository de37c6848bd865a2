#include <LumoraKit/login/LMRLocalizedString.h>
#include <LumoraKit/login/LMRLocalizedTables.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Platform.h>

#include <algorithm>

namespace lumora {
namespace {

constexpr std::string_view fallbackLanguage = "en";

char lowerCase(char letter) {
  return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
}

// Language tags do not tell capital letters from small ones (RFC 5646, section 2.1.1).
bool isSameTag(std::string_view left, std::string_view right) {
  return std::ranges::equal(left, right, {}, lowerCase, lowerCase);
}

std::string_view textInTable(std::string_view key, std::string_view language) {
  const auto tables = localizedTables();
  const auto table = std::ranges::find_if(tables, [&](const auto& each) { return isSameTag(each.language, language); });
  if (table == tables.end()) {
    return {};
  }
  const auto entry = std::ranges::lower_bound(table->entries, key, {}, &LocalizedEntry::key);
  return entry != table->entries.end() && entry->key == key ? entry->text : std::string_view();
}

// "zh-Hans-CN" gives "zh-Hans", then "zh", then nothing.
std::string_view lessSpecific(std::string_view language) {
  const auto end = language.rfind('-');
  return end == std::string_view::npos ? std::string_view() : language.substr(0, end);
}

} // namespace

std::string_view localizedText(std::string_view key, std::string_view language) {
  for (; !language.empty(); language = lessSpecific(language)) {
    if (const auto text = textInTable(key, language); !text.empty()) {
      return text;
    }
  }
  return textInTable(key, fallbackLanguage);
}

} // namespace lumora

std::string LMRLocalizedString(std::string_view key) {
  const auto language = lumora::Platform::current().application->language();
  const auto text = lumora::localizedText(key, language);
  return std::string(text.empty() ? key : text);
}
