#include "recorder/model/Texts.h"

#include <LumoraKit/LumoraKit.h>

namespace recorder {
namespace {

std::string_view inLanguage(const TextEntry& entry, std::string_view language) {
  const std::string_view main = language.substr(0, language.find('-'));
  if (main == "de") {
    return entry.german;
  }
  if (main == "fr") {
    return entry.french;
  }
  if (main == "es") {
    return entry.spanish;
  }
  if (main == "ja") {
    return entry.japanese;
  }
  return main == "ar" ? entry.arabic : entry.english;
}

} // namespace

std::string text(Text english) {
  return std::string(inLanguage(english.entry(), lumora::Platform::current().application->language()));
}

std::string filled(Text english, std::initializer_list<std::string> arguments) {
  const std::string pattern = text(english);
  std::string result;
  for (std::size_t i = 0; i < pattern.size(); ++i) {
    const bool isPlace = pattern[i] == '%' && i + 1 < pattern.size() && pattern[i + 1] >= '1' &&
                         static_cast<std::size_t>(pattern[i + 1] - '1') < arguments.size();
    if (isPlace) {
      result += *(arguments.begin() + (pattern[++i] - '1'));
    } else {
      result += pattern[i];
    }
  }
  return result;
}

} // namespace recorder
