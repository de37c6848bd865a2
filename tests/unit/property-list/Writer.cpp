#include "unit/property-list/Documents.h"

#include <LumoraKit/platform/Log.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

using namespace lumora;
using namespace lumora::tests;
using namespace std::chrono_literals;

namespace {

void expectRoundTrip(const Value& value) {
  LMRErrorRef error;
  const std::optional<std::string> written = xmlDescription(value, &error);
  ASSERT_TRUE(written) << text(error);
  const std::optional<Value> read = valueWithXMLDescription(*written, &error);
  ASSERT_TRUE(read) << text(error);
  EXPECT_EQ(read->type(), value.type());
  EXPECT_EQ(*read, value);
  EXPECT_EQ(xmlDescription(*read), written);
}

void expectRefused(const Value& value, PropertyListError code) {
  LMRErrorRef error;
  EXPECT_FALSE(xmlDescription(value, &error));
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), PropertyListErrorDomain);
  EXPECT_EQ(static_cast<PropertyListError>(error->code()), code);
  EXPECT_FALSE(xmlDescription(value));
}

TEST(PropertyListWriter, writesExactlyThisText_whenEveryTypeIsThere) {
  const Dictionary dictionary{{"string", "<a> & \"b\"\r"},
                              {"empty", ""},
                              {"integers", Array{-1, std::numeric_limits<std::uint64_t>::max()}},
                              {"real", 0.1},
                              {"flags", Array{true, false}},
                              {"date", Date(1263999845s)},
                              {"data", Data(60, 0)},
                              {"nothing", Array{Data{}, Array{}, Dictionary{}}}};
  EXPECT_EQ(xmlDescription(dictionary), R"(<?xml version="1.0" encoding="UTF-8"?>
<plist version="1.0">
<dict>
	<key>string</key>
	<string>&lt;a&gt; &amp; "b"&#13;</string>
	<key>empty</key>
	<string></string>
	<key>integers</key>
	<array>
		<integer>-1</integer>
		<integer>18446744073709551615</integer>
	</array>
	<key>real</key>
	<real>0.1</real>
	<key>flags</key>
	<array>
		<true/>
		<false/>
	</array>
	<key>date</key>
	<date>2010-01-20T15:04:05Z</date>
	<key>data</key>
	<data>
	AAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAAA
	AAAA
	</data>
	<key>nothing</key>
	<array>
		<data>
		</data>
		<array/>
		<dict/>
	</array>
</dict>
</plist>
)");
}

TEST(PropertyListWriter, writesTheSameText_whenTheRootIsGivenAsValueOrCollection) {
  const Array array{"server", Array{"host", 8170}};
  const Dictionary dictionary{{"a", array}};
  EXPECT_EQ(xmlDescription(array), xmlDescription(Value(array)));
  EXPECT_EQ(xmlDescription(dictionary), xmlDescription(Value(dictionary)));
}

TEST(PropertyListWriter, clearsTheError_whenItSucceeds) {
  LMRErrorRef error = LMRError::make("old", 1, "old");
  EXPECT_TRUE(xmlDescription(Array{}, &error));
  EXPECT_EQ(error, nullptr);
}

TEST(PropertyListRoundTrip, keepsStrings_whenTheyHoldWhatXMLTreatsSpecially) {
  for (const std::string_view string :
       {"", " ", "  a  ", "\n", "\ta\n", "\r", "\r\n", "a\rb\r\n", "<>&\"'", "]]>", "<![CDATA[a]]>", "&amp;",
        "<!-- -->", "\u00e9\u4e2d\U0001f3a5", "\u0085\u2028", "\ufffd\U0010ffff", "\ud7ff\ue000", "\x7f"}) {
    expectRoundTrip(string);
    expectRoundTrip(Dictionary{{std::string(string), string}});
  }
}

TEST(PropertyListRoundTrip, keepsIntegers_whenTheyAreAtTheLimits) {
  for (const std::int64_t number : {std::numeric_limits<std::int64_t>::min(), std::int64_t{-1}, std::int64_t{0},
                                    std::int64_t{1}, std::numeric_limits<std::int64_t>::max()}) {
    expectRoundTrip(number);
  }
  for (const std::uint64_t number : {std::uint64_t{1} << 63, std::numeric_limits<std::uint64_t>::max()}) {
    expectRoundTrip(number);
  }
}

TEST(PropertyListRoundTrip, keepsReals_whenTheyAreAtTheLimits) {
  using limits = std::numeric_limits<double>;
  for (const double number : {0.0, 1.0, -1.0, 0.1, 1.0 / 3.0, 1e22, 1e23, 123456789012345680.0, limits::max(),
                              limits::lowest(), limits::min(), limits::denorm_min(), -limits::denorm_min(),
                              limits::epsilon(), limits::infinity(), -limits::infinity(), limits::quiet_NaN()}) {
    expectRoundTrip(number);
  }
  const auto minusZero = valueWithXMLDescription(xmlDescription(Value(-0.0)).value());
  EXPECT_TRUE(std::signbit(*minusZero->real()));
}

TEST(PropertyListRoundTrip, keepsDates_whenTheyAreAtTheLimits) {
  for (const Date date : {Date(-62135596800s), Date(-1s), Date(0s), Date(951782400s), Date(253402300799s)}) {
    expectRoundTrip(date);
  }
}

TEST(PropertyListRoundTrip, keepsData_whenItHasAnyLength) {
  for (std::size_t size = 0; size < 200; ++size) {
    Data bytes(size);
    for (std::size_t i = 0; i < size; ++i) {
      bytes[i] = static_cast<std::uint8_t>(i * 37 + size);
    }
    expectRoundTrip(bytes);
  }
}

TEST(PropertyListRoundTrip, keepsCollections_whenTheyAreMixed) {
  expectRoundTrip(true);
  expectRoundTrip(false);
  expectRoundTrip(Array{});
  expectRoundTrip(Dictionary{});
  expectRoundTrip(Array{Array{}, Array{Array{}, Dictionary{}}, Dictionary{{"", Array{1, "1", 1.0, true}}}});
}

TEST(PropertyListWriter, refusesAString_whenXMLCannotCarryIt) {
  using namespace std::string_literals;
  for (const std::string& string : {"\0"s,
                                    "\x01"s,
                                    "a\x08"s,
                                    "\x0b"s,
                                    "\x0c"s,
                                    "\x0e"s,
                                    "\x1f"s,
                                    "\xff"s,
                                    "\x80"s,
                                    "\xc3"s,
                                    "a\xe2\x82"s,
                                    "\xc0\xaf"s,
                                    "\xc1\xbf"s,
                                    "\xe0\x80\x80"s,
                                    "\xed\xa0\x80"s,
                                    "\xed\xbf\xbf"s,
                                    "\xef\xbf\xbe"s,
                                    "\xef\xbf\xbf"s,
                                    "\xf0\x80\x80\x80"s,
                                    "\xf4\x90\x80\x80"s,
                                    "\xf8\x88\x80\x80\x80"s,
                                    "\xc3\x28"s}) {
    expectRefused(string, PropertyListError::Unrepresentable);
    expectRefused(Dictionary{{"key", Array{string}}}, PropertyListError::Unrepresentable);
    expectRefused(Dictionary{{string, 1}}, PropertyListError::Unrepresentable);
  }
}

TEST(PropertyListWriter, saysWhatAndWhere_whenXMLCannotCarryAString) {
  LMRErrorRef error;
  EXPECT_FALSE(xmlDescription(Array{"ab\x1b"}, &error));
  EXPECT_EQ(error->localizedDescription(), "XML cannot carry the byte 27 at offset 2 of a text");
}

TEST(PropertyListWriter, refusesADate_whenItsYearHasNotFourDigits) {
  for (const Date date : {Date(-62135596801s), Date(253402300800s), Date::min(), Date::max()}) {
    expectRefused(date, PropertyListError::Unrepresentable);
  }
}

} // namespace
