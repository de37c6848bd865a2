#include <gtest/gtest.h>

#include <limits>

#include <client/output/Fields.h>
#include <client/output/JSON.h>
#include <client/output/Text.h>

using lumora::Array;
using lumora::Data;
using lumora::Date;
using lumora::Dictionary;
using lumora::Value;
using lumora::client::byteText;
using lumora::client::durationText;
using lumora::client::json;
using lumora::client::plainText;
using lumora::client::printable;

namespace {

TEST(JSONTest, writesEveryKindOfValue) {
  EXPECT_EQ(json(Dictionary{{"string", "x"},
                            {"integer", std::numeric_limits<std::int64_t>::min()},
                            {"unsigned", std::numeric_limits<std::uint64_t>::max()},
                            {"real", 0.1},
                            {"boolean", true},
                            {"date", Date(std::chrono::seconds(1795254483))},
                            {"data", Data{1, 2, 3, 255}},
                            {"array", Array{1, false, Array()}},
                            {"dictionary", Dictionary()}}),
            R"({
  "string": "x",
  "integer": -9223372036854775808,
  "unsigned": 18446744073709551615,
  "real": 0.1,
  "boolean": true,
  "date": "2026-11-21T09:48:03Z",
  "data": "AQID/w==",
  "array": [
    1,
    false,
    []
  ],
  "dictionary": {}
}
)");
}

TEST(JSONTest, writesNumbersThatJSONLacks_asStrings) {
  EXPECT_EQ(json(std::numeric_limits<double>::quiet_NaN()), "\"NaN\"\n");
  EXPECT_EQ(json(std::numeric_limits<double>::infinity()), "\"Infinity\"\n");
  EXPECT_EQ(json(-std::numeric_limits<double>::infinity()), "\"-Infinity\"\n");
  EXPECT_EQ(json(1e300), "1e+300\n");
}

TEST(JSONTest, escapesWhatMustNotStandInAString) {
  EXPECT_EQ(json("\"\\/\b\f\n\r\t\x01\x7f\xC2\x85é🎥"), "\"\\\"\\\\/\\u0008\\u000c\\n\\r\\t\\u0001\\u007f\\u0085é🎥\"\n");
  EXPECT_EQ(json(Dictionary{{"a\"b", 1}}), "{\n  \"a\\\"b\": 1\n}\n");
}

TEST(JSONTest, neverWritesInvalidUTF8) {
  EXPECT_EQ(json("a\xff\xc3z"), "\"a\uFFFD\uFFFDz\"\n");
  EXPECT_EQ(json(std::string("a\0b", 3)), "\"a\uFFFDb\"\n");
}

TEST(JSONTest, writesAnyNesting) {
  Value value = 1;
  for (int depth = 0; depth < 100000; ++depth) {
    Array array;
    array.push_back(std::move(value));
    value = std::move(array);
  }
  const auto text = json(value);
  EXPECT_EQ(std::count(text.begin(), text.end(), '['), 100000);
  EXPECT_EQ(std::count(text.begin(), text.end(), ']'), 100000);
}

TEST(JSONTest, writesDatesFarAway) {
  EXPECT_EQ(json(Date(std::chrono::seconds(-62135596800))), "\"0001-01-01T00:00:00Z\"\n");
}

TEST(TextTest, showsControlCharactersAsEscapes) {
  EXPECT_EQ(printable("a\n\t\r\x1b[31m\x7f"), "a\\n\\t\\r\\x1b[31m\\x7f");
  EXPECT_EQ(printable("\u202Eevil\u2028"), "\\u202eevil\\u2028");
  EXPECT_EQ(printable("é講🎥"), "é講🎥");
  EXPECT_EQ(printable("a\xffz\xc3"), "a\uFFFDz\uFFFD");
  EXPECT_EQ(printable(std::string_view("a\0b", 3)), "a\\x00b");
}

TEST(TextTest, knowsHowWideATextIs) {
  EXPECT_EQ(lumora::client::width("abc"), 3U);
  EXPECT_EQ(lumora::client::width("講義"), 4U);
  EXPECT_EQ(lumora::client::width("e\u0301"), 1U);
}

TEST(TextTest, tellsValuesToPeople) {
  EXPECT_EQ(plainText(true), "yes");
  EXPECT_EQ(plainText(false), "no");
  EXPECT_EQ(plainText(-5), "-5");
  EXPECT_EQ(plainText(Array{"a", 1, true}), "a, 1, yes");
  EXPECT_EQ(plainText(Array{Value(Array{1})}), "[[1]]");
  EXPECT_EQ(plainText(Dictionary{{"a", "b\n"}}), "{a: b\\n}");
  EXPECT_EQ(plainText(Data(1500)), "1.5 kB of data");
}

TEST(TextTest, tellsBytesInUnitsOfAThousand) {
  EXPECT_EQ(byteText(0), "0 B");
  EXPECT_EQ(byteText(999), "999 B");
  EXPECT_EQ(byteText(1000), "1.0 kB");
  EXPECT_EQ(byteText(999949), "999.9 kB");
  EXPECT_EQ(byteText(999950), "1.0 MB");
  EXPECT_EQ(byteText(std::numeric_limits<std::uint64_t>::max()), "18.4 EB");
  EXPECT_EQ(byteText(-1), "-1");
  EXPECT_EQ(byteText("much"), "much");
  EXPECT_EQ(byteText(true), "yes");
}

TEST(TextTest, tellsDurations) {
  EXPECT_EQ(durationText(0.9), "0:00");
  EXPECT_EQ(durationText(65), "1:05");
  EXPECT_EQ(durationText(3600 + 65), "1:01:05");
  EXPECT_EQ(durationText(-1), "-1");
  EXPECT_EQ(durationText(1e300), "1e+300");
  EXPECT_EQ(durationText("long"), "long");
}

const std::vector<lumora::client::Field> fields{{"name", "Name", plainText}, {"size", "Size", byteText}};

TEST(FieldsTest, tableLeavesEmptyColumnsOut) {
  EXPECT_EQ(lumora::client::table({Dictionary{{"name", "a"}}, Dictionary{{"name", "bcdef"}}}, fields),
            "Name\na\nbcdef\n");
}

TEST(FieldsTest, tableShowsRowsThatAreNone) {
  EXPECT_EQ(lumora::client::table({"odd", Dictionary{{"name", "a"}, {"size", 5}}}, fields),
            "Name  Size\nodd\na     5 B\n");
}

TEST(FieldsTest, longCellDoesNotWidenItsColumn) {
  const std::string name(100, 'x');
  EXPECT_EQ(
      lumora::client::table({Dictionary{{"name", name}, {"size", 5}}, Dictionary{{"name", "a"}, {"size", 6}}}, fields),
      "Name  Size\n" + name + "  5 B\na     6 B\n");
}

TEST(FieldsTest, factsLeaveNothingOut) {
  EXPECT_EQ(lumora::client::facts({{"other\n", 1}, {"size", 2000}, {"empty", ""}}, fields),
            "Size     2.0 kB\nother\\n  1\nempty    -\n");
}

} // namespace
