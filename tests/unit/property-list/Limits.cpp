#include "support/SmallStack.h"
#include "unit/property-list/Documents.h"

#include <LumoraKit/platform/Log.h>

using namespace lumora;
using namespace lumora::tests;

namespace {

constexpr std::size_t deepest = 10'000;

Value nestedValue(std::size_t depth, bool dictionaries) {
  Value value = "innermost";
  while (depth-- > 0) {
    if (dictionaries) {
      Dictionary outer;
      outer.set("inner", std::move(value));
      value = std::move(outer);
    } else {
      Array outer;
      outer.push_back(std::move(value));
      value = std::move(outer);
    }
  }
  return value;
}

PropertyListError refusal(std::string_view document) {
  LMRErrorRef error;
  EXPECT_FALSE(valueWithXMLDescription(document, &error));
  return error ? static_cast<PropertyListError>(error->code()) : PropertyListError{};
}

TEST(PropertyListLimits, readsTenThousandLevels_whenTheStackIsSmall) {
  onSmallStack([] {
    EXPECT_TRUE(valueWithXMLDescription(nestedArrays(deepest)));
    const std::string dictionaries =
        documentOf(repeated("<dict><key>a</key>", deepest) + "<true/>" + repeated("</dict>", deepest));
    EXPECT_TRUE(valueWithXMLDescription(dictionaries));
  });
}

TEST(PropertyListLimits, refusesToRead_whenTheNestingIsOneDeeper) {
  LMRErrorRef error;
  EXPECT_FALSE(valueWithXMLDescription(nestedArrays(deepest + 1), &error));
  EXPECT_EQ(static_cast<PropertyListError>(error->code()), PropertyListError::TooDeep);
  EXPECT_EQ(*error->userInfo().find("byte"), Value(static_cast<std::uint64_t>(21 + 7 * deepest)));
}

TEST(PropertyListLimits, refusesToRead_whenAMillionElementsAreOpen) {
  onSmallStack([] { EXPECT_EQ(refusal(nestedArrays(1'000'000)), PropertyListError::TooDeep); });
}

TEST(PropertyListLimits, writesTenThousandLevels_whenTheStackIsSmall) {
  onSmallStack([] {
    for (const bool dictionaries : {false, true}) {
      const Value value = nestedValue(deepest, dictionaries);
      const std::optional<std::string> written = xmlDescription(value);
      ASSERT_TRUE(written);
      EXPECT_LT(written->size(), 150 * deepest);
      EXPECT_EQ(valueWithXMLDescription(*written), value);
    }
  });
}

TEST(PropertyListLimits, refusesToWrite_whenTheNestingIsOneDeeper) {
  for (const bool dictionaries : {false, true}) {
    LMRErrorRef error;
    EXPECT_FALSE(xmlDescription(nestedValue(deepest + 1, dictionaries), &error));
    EXPECT_EQ(static_cast<PropertyListError>(error->code()), PropertyListError::TooDeep);
  }
}

TEST(PropertyListLimits, countsEmptyCollections_whenTheNestingIsMeasured) {
  Value innermost = Array{};
  Array array;
  for (std::size_t depth = 0; depth < deepest; ++depth) {
    Array outer;
    outer.push_back(std::move(innermost));
    innermost = std::move(outer);
  }
  EXPECT_FALSE(xmlDescription(innermost));
  EXPECT_TRUE(xmlDescription(innermost.array()->front()));
}

TEST(PropertyListLimits, readsAndWritesAString_whenItHasFiftyMegabytes) {
  const std::string line = "A line of text & more,\tand then a line end.\n";
  const Value value = repeated(line, 50'000'000 / line.size());
  const std::optional<std::string> written = xmlDescription(value);
  ASSERT_TRUE(written);
  EXPECT_TRUE(valueWithXMLDescription(*written) == value);
}

std::string manyKeys(std::size_t count, std::size_t distinct) {
  std::string entries;
  for (std::size_t i = 0; i < count; ++i) {
    entries += "<key>key " + std::to_string(i % distinct) + "</key><integer>" + std::to_string(i) + "</integer>";
  }
  return documentOf("<dict>" + entries + "</dict>");
}

// Comparing each key with each other would take minutes, beyond the time limit of the test.
TEST(PropertyListLimits, readsADictionary_whenItHasManyKeys) {
  constexpr std::size_t count = 200'000;
  const auto dictionary = dictionaryWithXMLDescription(manyKeys(count, count));
  ASSERT_TRUE(dictionary);
  EXPECT_EQ(dictionary->size(), count);
  EXPECT_EQ((dictionary->end() - 1)->second, Value(static_cast<std::uint64_t>(count - 1)));
}

TEST(PropertyListLimits, keepsTheLastValues_whenManyKeysAreRepeated) {
  constexpr std::uint64_t count = 100'000;
  constexpr std::uint64_t distinct = 1'000;
  const auto dictionary = dictionaryWithXMLDescription(manyKeys(count, distinct));
  ASSERT_TRUE(dictionary);
  ASSERT_EQ(dictionary->size(), distinct);
  std::uint64_t place = 0;
  for (const auto& [key, value] : *dictionary) {
    EXPECT_EQ(key, "key " + std::to_string(place));
    EXPECT_EQ(value, Value(count - distinct + place));
    ++place;
  }
}

} // namespace
