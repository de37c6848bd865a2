#include "support/ValuePrinter.h"

#include <LumoraKit/platform/Value.h>

#include <gtest/gtest.h>

using namespace lumora;

namespace {

TEST(Dictionary, keepsTheOrderOfInsertion_whenKeysAreSet) {
  Dictionary dictionary;
  dictionary.set("b", 1);
  dictionary.set("a", 2);
  dictionary.set("b", 3);
  EXPECT_EQ(Value(dictionary).description(), "{b: 3, a: 2}");
  EXPECT_EQ(dictionary.size(), 2U);
}

TEST(Dictionary, findsValues_whenKeysAreThere) {
  Dictionary dictionary{{"text", "a"}, {"list", Array{1}}, {"inner", Dictionary{{"b", 2}}}};
  EXPECT_TRUE(dictionary.contains("text"));
  EXPECT_EQ(*dictionary.find("text"), Value("a"));
  EXPECT_EQ(dictionary.string("text"), "a");
  EXPECT_EQ(*dictionary.array("list"), Array{1});
  EXPECT_EQ(*dictionary.dictionary("inner"), Dictionary({{"b", 2}}));
  *dictionary.find("text") = 5;
  EXPECT_EQ(*dictionary.find("text"), Value(5));
}

TEST(Dictionary, givesNothing_whenAKeyIsAbsentOrOfAnotherType) {
  const Dictionary dictionary{{"text", "a"}, {"number", 1}};
  EXPECT_FALSE(dictionary.contains("other"));
  EXPECT_EQ(dictionary.find("other"), nullptr);
  EXPECT_EQ(dictionary.string("other"), std::nullopt);
  EXPECT_EQ(dictionary.string("number"), std::nullopt);
  EXPECT_EQ(dictionary.array("text"), nullptr);
  EXPECT_EQ(dictionary.dictionary("text"), nullptr);
  EXPECT_EQ(dictionary.dictionary("other"), nullptr);
}

TEST(Dictionary, forgetsAKey_whenItIsRemoved) {
  Dictionary dictionary{{"a", 1}, {"b", 2}, {"c", 3}};
  EXPECT_TRUE(dictionary.remove("b"));
  EXPECT_FALSE(dictionary.remove("b"));
  EXPECT_EQ(Value(dictionary).description(), "{a: 1, c: 3}");
}

TEST(Dictionary, keepsTheLastValueInTheFirstPlace_whenEntriesRepeatAKey) {
  EXPECT_EQ(Value(Dictionary{{"a", 1}, {"b", 2}, {"a", 3}}).description(), "{a: 3, b: 2}");
  EXPECT_EQ(Value(Dictionary{{"a", 1}, {"a", 2}, {"a", 3}}).description(), "{a: 3}");
}

TEST(Dictionary, keepsTheLastValueInTheFirstPlace_whenManyEntriesRepeatKeys) {
  std::vector<Dictionary::Entry> entries;
  for (int i = 0; i < 100; ++i) {
    entries.emplace_back("key " + std::to_string(i % 30), i);
  }
  const Dictionary dictionary = Dictionary::fromEntries(std::move(entries));
  ASSERT_EQ(dictionary.size(), 30U);
  int place = 0;
  for (const auto& [key, value] : dictionary) {
    EXPECT_EQ(key, "key " + std::to_string(place));
    EXPECT_EQ(value, Value(place < 10 ? 90 + place : 60 + place));
    ++place;
  }
}

TEST(Dictionary, equals_whenTheOrderOfKeysDiffers) {
  EXPECT_EQ(Dictionary({{"a", 1}, {"b", Array{2}}}), Dictionary({{"b", Array{2}}, {"a", 1}}));
  EXPECT_NE(Dictionary({{"a", 1}, {"b", 2}}), Dictionary({{"a", 2}, {"b", 1}}));
  EXPECT_NE(Dictionary({{"a", 1}}), Dictionary({{"b", 1}}));
  EXPECT_NE(Dictionary({{"a", 1}}), Dictionary({{"a", 1}, {"b", 1}}));
  EXPECT_EQ(Dictionary(), Dictionary());
}

} // namespace
