#include "recorder/model/Texts.h"

#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <set>
#include <string>

namespace recorder {
namespace {

// The places that are filled in, and whether there is a key that leads to it.
std::multiset<std::string> marksOf(std::string_view text) {
  std::multiset<std::string> marks;
  for (std::size_t i = 0; i + 1 < text.size(); ++i) {
    if (text[i] == '%' && text[i + 1] != ' ') {
      marks.insert(std::string(text.substr(i, 2)));
    } else if (text[i] == '&') {
      marks.insert("&");
    }
  }
  return marks;
}

// The letter that leads to it, whichever case; also one of two bytes.
std::string keyOf(std::string_view text) {
  const std::string_view letter = text.substr(text.find('&') + 1);
  const auto first = static_cast<unsigned char>(letter.front());
  return first < 0x80 ? std::string(1, static_cast<char>(std::toupper(first))) : std::string(letter.substr(0, 2));
}

TEST(Texts, areThereInAllLanguages_withTheSamePlaces) {
  for (const TextEntry& entry : textTable) {
    for (const std::string_view each : {entry.german, entry.french, entry.spanish, entry.japanese, entry.arabic}) {
      EXPECT_FALSE(each.empty()) << entry.english;
      EXPECT_EQ(marksOf(each), marksOf(entry.english)) << each;
    }
  }
}

TEST(Texts, standOnceInTheTable) {
  std::set<std::string_view> all;
  for (const TextEntry& entry : textTable) {
    EXPECT_TRUE(all.insert(entry.english).second) << entry.english;
  }
}

// What is seen together.
TEST(Texts, leadToOneThingEach_byTheirKeys) {
  const std::set<std::string_view> window{"&Application", "&Recording",   "&Workflow",
                                          "&Title",       "&Description", "Su&bmissions"};
  const std::set<std::string_view> applicationMenu{"&Log In…", "&Settings…", "&Quit"};
  const std::set<std::string_view> recordingMenu{"&Record", "&Pause or Resume", "&Stop and Submit", "&Discard…"};
  const std::set<std::string_view> settings{
      "&Folder for recordings:", "&Quality:", "&Encoder:", "&Camera:", "&Microphone:"};
  for (const auto& group : {window, applicationMenu, recordingMenu, settings}) {
    for (const auto language : {&TextEntry::english, &TextEntry::german, &TextEntry::french, &TextEntry::spanish,
                                &TextEntry::japanese, &TextEntry::arabic}) {
      std::set<std::string> keys;
      for (const TextEntry& entry : textTable) {
        if (group.contains(entry.english)) {
          EXPECT_TRUE(keys.insert(keyOf(entry.*language)).second) << entry.*language;
        }
      }
      EXPECT_EQ(keys.size(), group.size());
    }
  }
}

TEST(Texts, followTheLanguageOfTheApplication) {
  const lumora::fakes::FakePlatform platform;
  EXPECT_EQ(text("Record"), "Record");
  for (const auto& [language, expected] :
       {std::pair("de-AT", "Aufnehmen"), std::pair("fr", "Enregistrer"), std::pair("es", "Grabar"),
        std::pair("ja", "収録"), std::pair("ar-EG", "تسجيل"), std::pair("nl", "Record")}) {
    platform.application->setLanguage(language);
    EXPECT_EQ(text("Record"), expected);
  }
}

TEST(Texts, areFilled) {
  const lumora::fakes::FakePlatform platform;
  EXPECT_EQ(filled("%1 at %2", {"Ada", "localhost"}), "Ada at localhost");
  EXPECT_EQ(filled("Room for %1", {"%1"}), "Room for %1");
}

} // namespace
} // namespace recorder
