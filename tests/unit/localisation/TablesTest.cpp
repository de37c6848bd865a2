#include "support/TemporaryFolder.h"

#include <LumoraKit/actions/LMRStatusCodes.h>
#include <LumoraKit/login/LMRLocalizedTables.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <regex>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

using lumora::LocalizedTable;
using lumora::localizedTables;
using testing::UnorderedElementsAre;

namespace {

const std::string escapedEllipsis = "\\U2026";
const std::string ellipsis = "…";

const LocalizedTable& table(std::string_view language) {
  return *std::ranges::find(localizedTables(), language, &LocalizedTable::language);
}

std::set<std::string> keys(const LocalizedTable& table) {
  std::set<std::string> keys;
  for (const auto& entry : table.entries) {
    keys.emplace(entry.key);
  }
  return keys;
}

std::string withEllipsis(std::string_view key) {
  std::string text(key);
  if (const auto place = text.find(escapedEllipsis); place != std::string::npos) {
    text.replace(place, escapedEllipsis.size(), ellipsis);
  }
  return text;
}

TEST(TablesTest, areInSixLanguages) {
  std::vector<std::string_view> languages;
  std::ranges::transform(localizedTables(), std::back_inserter(languages), &LocalizedTable::language);
  EXPECT_THAT(languages, UnorderedElementsAre("en", "de", "fr", "es", "ja", "ar"));
}

TEST(TablesTest, haveTheSameKeys) {
  for (const auto& each : localizedTables()) {
    EXPECT_EQ(keys(each), keys(table("en"))) << each.language;
  }
}

TEST(TablesTest, areSorted) {
  for (const auto& each : localizedTables()) {
    EXPECT_TRUE(std::ranges::is_sorted(each.entries, {}, &lumora::LocalizedEntry::key)) << each.language;
  }
}

TEST(TablesTest, englishIsTheKeyItselfWithARealEllipsis) {
  for (const auto& [key, text] : table("en").entries) {
    EXPECT_EQ(text, withEllipsis(key));
  }
}

TEST(TablesTest, textsEndWithAnEllipsis_whereTheirKeysDo) {
  for (const auto& each : localizedTables()) {
    for (const auto& [key, text] : each.entries) {
      EXPECT_EQ(text.ends_with(ellipsis), key.ends_with(escapedEllipsis)) << each.language << ": " << key;
      EXPECT_EQ(text.find(escapedEllipsis), std::string_view::npos) << each.language << ": " << key;
    }
  }
}

TEST(TablesTest, everyTextIsTranslated) {
  // These are German words as well.
  const std::set<std::pair<std::string_view, std::string_view>> same{{"de", "Server"}, {"de", "&Server:"}};
  for (const auto& each : localizedTables()) {
    for (const auto& [key, text] : each.entries) {
      const bool isTheSame = each.language == "en" || same.contains({each.language, key});
      EXPECT_EQ(text == withEllipsis(key), isTheSame) << each.language << ": " << key;
    }
  }
}

TEST(TablesTest, holdTheMessageOfEveryStatus) {
  const lumora::fakes::FakePlatform platform;
  const auto known = keys(table("en"));
  for (int status = -1; status < 256; ++status) {
    EXPECT_EQ(known.count(lumora::messageForStatusCode(status)), 1U) << status;
  }
}

// Adds the keys that stand as literals in calls of a function.
void addLiteralKeys(std::string_view source, const std::string& function, std::set<std::string>& keys) {
  const std::string call = function + "(\"";
  for (auto place = source.find(call); place != std::string_view::npos; place = source.find(call, place)) {
    place += call.size();
    const auto literal = source.substr(place, source.find('"', place) - place);
    std::string key(literal);
    // The one escape that keys hold.
    if (const auto escape = key.find("\\\\U"); escape != std::string::npos) {
      key.erase(escape, 1);
    }
    keys.insert(key);
  }
}

// The keys of the framework's sources.
std::set<std::string> literalKeys() {
  std::set<std::string> keys;
  for (const auto& file : std::filesystem::recursive_directory_iterator(LUMORA_SOURCE_DIR "/LumoraKit")) {
    if (file.path().extension() == ".cpp") {
      const std::string source = lumora::tests::contentOf(file.path());
      addLiteralKeys(source, "LMRLocalizedString", keys);
      addLiteralKeys(source, "localizedText", keys);
      addLiteralKeys(source, "missingDevice", keys);
    }
  }
  return keys;
}

TEST(TablesTest, holdEveryKeyOfTheSources) {
  const auto known = keys(table("en"));
  const auto used = literalKeys();
  EXPECT_EQ(used.count("Connecting\\U2026"), 1U);
  EXPECT_EQ(used.count("Generic podcast error"), 1U);
  EXPECT_EQ(used.count("Cannot find the audio device"), 1U);
  for (const auto& key : used) {
    EXPECT_EQ(known.count(key), 1U) << key;
  }
}

TEST(TablesTest, holdEveryTextOfTheInterfaceFiles) {
  const auto known = keys(table("en"));
  const std::regex text("<string>([^<]*)</string>");
  for (const char* const file : {"ServerLoginView.ui", "ServerLoginWindow.ui"}) {
    const std::string source = lumora::tests::contentOf(std::string(LUMORA_SOURCE_DIR "/LumoraKit/resources/") + file);
    std::size_t count = 0;
    for (std::sregex_iterator found(source.begin(), source.end(), text), end; found != end; ++found, ++count) {
      const std::string key = std::regex_replace((*found)[1].str(), std::regex("&amp;"), "&");
      EXPECT_EQ(known.count(key), 1U) << file << ": " << key;
    }
    EXPECT_GT(count, 1U) << file;
  }
}

} // namespace
