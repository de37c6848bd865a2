#include "unit/property-list/Documents.h"

#include <LumoraKit/platform/Log.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

using namespace lumora;
using namespace lumora::tests;
using namespace std::chrono_literals;

namespace {

struct Accepted {
  std::string name;
  std::string text;
  Value value;
};

void PrintTo(const Accepted& accepted, std::ostream* out) {
  *out << accepted.text.substr(0, 200);
}

class AcceptedDocument : public testing::TestWithParam<Accepted> {};

TEST_P(AcceptedDocument, isRead) {
  LMRErrorRef error;
  const std::optional<Value> value = valueWithXMLDescription(GetParam().text, &error);
  ASSERT_TRUE(value) << text(error);
  EXPECT_EQ(error, nullptr);
  EXPECT_EQ(*value, GetParam().value) << value->description();
}

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr std::int64_t smallest = std::numeric_limits<std::int64_t>::min();
constexpr std::int64_t largest = std::numeric_limits<std::int64_t>::max();

Accepted body(std::string name, std::string_view content, Value value) {
  return {std::move(name), documentOf(content), std::move(value)};
}

std::vector<Accepted> integers() {
  return {
      body("zero", "<integer>0</integer>", 0),
      body("minusZero", "<integer>-0</integer>", 0),
      body("plusSign", "<integer>+7</integer>", 7),
      body("minusOne", "<integer>-1</integer>", -1),
      body("leadingZeros", "<integer>007</integer>", 7),
      body("spaceAround", "<integer> \n\t42\r\n </integer>", 42),
      body("comment", "<integer>4<!-- and -->2</integer>", 42),
      body("smallestInteger", "<integer>-9223372036854775808</integer>", smallest),
      body("largestSigned", "<integer>9223372036854775807</integer>", largest),
      body("firstUnsigned", "<integer>9223372036854775808</integer>", std::uint64_t{1} << 63),
      body("largestUnsigned", "<integer>18446744073709551615</integer>", std::numeric_limits<std::uint64_t>::max()),
      body("hexadecimal", "<integer>0xFf</integer>", 255),
      body("hexadecimalCapitalX", "<integer>0X10</integer>", 16),
      body("negativeHexadecimal", "<integer>-0x8000000000000000</integer>", smallest),
      body("digitAsReference", "<integer>&#49;2</integer>", 12),
  };
}

std::vector<Accepted> reals() {
  return {
      body("realZero", "<real>0</real>", 0.0),
      body("realFraction", "<real>0.1</real>", 0.1),
      body("realWithoutInteger", "<real>.5</real>", 0.5),
      body("realWithoutFraction", "<real>5.</real>", 5.0),
      body("realPlus", "<real>+1.5</real>", 1.5),
      body("realExponent", "<real>-2.5E+3</real>", -2500.0),
      body("realSpace", "<real>\n 1e3\n</real>", 1000.0),
      body("realLargest", "<real>1.7976931348623157e308</real>", std::numeric_limits<double>::max()),
      body("realSmallestNormal", "<real>2.2250738585072014e-308</real>", std::numeric_limits<double>::min()),
      body("realDenormal", "<real>5e-324</real>", std::numeric_limits<double>::denorm_min()),
      body("realNaN", "<real>nan</real>", std::nan("")),
      body("realNaNCapitals", "<real>NaN</real>", std::nan("")),
      body("realInfinity", "<real>+infinity</real>", infinity),
      body("realMinusInfinity", "<real>-infinity</real>", -infinity),
      body("realShortInfinity", "<real>INF</real>", infinity),
  };
}

std::vector<Accepted> strings() {
  return {
      body("emptyString", "<string></string>", ""),
      body("emptyStringElement", "<string/>", ""),
      body("spacesAreKept", "<string>  a \n\t</string>", "  a \n\t"),
      body("onlySpaces", "<string>   </string>", "   "),
      body("lineEndsAreOne", "<string>a\r\nb\rc</string>", "a\nb\nc"),
      body("carriageReturnAsReference", "<string>a&#13;b&#xD;</string>", "a\rb\r"),
      body("fiveEntities", "<string>&lt;&gt;&amp;&quot;&apos;</string>", "<>&\"'"),
      body("characterData", "<string><![CDATA[<b>&amp;]]></string>", "<b>&amp;"),
      body("characterDataInPieces", "<string>a<![CDATA[b]]>c</string>", "abc"),
      body("commentInside", "<string>a<!-- b -->c</string>", "ac"),
      body("instructionInside", "<string>a<?b c?>d</string>", "ad"),
      body("umlaut", "<string>\u00e4</string>", "\u00e4"),
      body("outsideTheBasicPlane", "<string>\U0001f3a5&#x1F3A5;</string>", "\U0001f3a5\U0001f3a5"),
      body("lastCharacters", "<string>\ufffd\U0010ffff</string>", "\ufffd\U0010ffff"),
      body("c1Control", "<string>&#x85;</string>", "\u0085"),
      body("deleteCharacter", "<string>\x7f</string>", "\x7f"),
  };
}

std::vector<Accepted> otherValues() {
  return {
      body("true", "<true/>", true),
      body("carriageReturnOutsideAValue", "&#13;<true/>&#13;", true),
      body("falseInTwoTags", "<false></false>", false),
      body("date", "<date>2010-01-20T15:04:05Z</date>", Date(1263999845s)),
      body("epoch", "<date>1970-01-01T00:00:00Z</date>", Date(0s)),
      body("beforeTheEpoch", "<date>1969-12-31T23:59:59Z</date>", Date(-1s)),
      body("firstDate", "<date>0001-01-01T00:00:00Z</date>", Date(-62135596800s)),
      body("lastDate", "<date>9999-12-31T23:59:59Z</date>", Date(253402300799s)),
      body("leapDay", "<date>2000-02-29T00:00:00Z</date>", Date(951782400s)),
      body("dateSpace", "<date>\n2000-02-29T00:00:00Z </date>", Date(951782400s)),
      body("emptyData", "<data></data>", Data{}),
      body("emptyDataElement", "<data/>", Data{}),
      body("dataOfSpaces", "<data>\n\t\n</data>", Data{}),
      body("oneByte", "<data>AA==</data>", Data{0}),
      body("twoBytes", "<data>AAE=</data>", Data{0, 1}),
      body("threeBytes", "<data>AAEC</data>", Data{0, 1, 2}),
      body("fourBytes", "<data>//79+w==</data>", Data{0xff, 0xfe, 0xfd, 0xfb}),
      body("dataInLines", "<data>\n\tAA\n\tEC\n</data>", Data{0, 1, 2}),
      body("spaceBeforePadding", "<data>AA =\n= </data>", Data{0}),
  };
}

std::vector<Accepted> collections() {
  return {
      body("emptyArray", "<array/>", Array{}),
      body("emptyArrayInTwoTags", "<array> \n </array>", Array{}),
      body("emptyDictionary", "<dict/>", Dictionary{}),
      body("array", "<array><string>a</string> <integer>1</integer></array>", Array{"a", 1}),
      body("arrayInArray", "<array><array/><array><true/></array></array>", Array{Array{}, Array{true}}),
      body("dictionary", "<dict><key>a</key><integer>1</integer></dict>", Dictionary{{"a", 1}}),
      body("emptyKey", "<dict><key/><integer>1</integer></dict>", Dictionary{{"", 1}}),
      body("keyWithSpaces", "<dict><key> a </key><integer>1</integer></dict>", Dictionary{{" a ", 1}}),
      body("keyWithEntity", "<dict><key>&lt;</key><integer>1</integer></dict>", Dictionary{{"<", 1}}),
      body("commentBetweenKeyAndValue", "<dict><key>a</key><!-- b --><true/></dict>", Dictionary{{"a", true}}),
      body("commentInArray", "<array><!-- a --></array>", Array{}),
      body("dictionaryInDictionary", "<dict><key>a</key><dict><key>a</key><dict/></dict></dict>",
           Dictionary{{"a", Dictionary{{"a", Dictionary{}}}}}),
  };
}

std::vector<Accepted> documents() {
  const std::u16string list = u"<plist><string>\u00e9\u4e2d\U0001f3a5</string></plist>";
  const std::string declared = "<?xml version=\"1.0\" encoding=\"";
  return {
      {"withoutVersion", "<plist><true/></plist>", true},
      {"declaration", "<?xml version=\"1.0\"?><plist><true/></plist>", true},
      {"standalone", "<?xml version='1.0' encoding='utf-8' standalone='yes'?>\n<plist><true/></plist>\n", true},
      {"byteOrderMark", "\xef\xbb\xbf<plist><true/></plist>", true},
      {"commentsAround", "<!-- a --><plist><!-- b --><true/><!-- c --></plist><!-- d -->", true},
      {"instructionsAround", "<?a b?><plist><true/></plist><?c d?>\n", true},
      {"documentType", "<!DOCTYPE plist SYSTEM \"plist.dtd\"><plist><true/></plist>", true},
      {"documentTypeWithPublicName", "<!DOCTYPE plist PUBLIC \"list\" \"plist.dtd\"><plist><true/></plist>", true},
      {"documentTypeWithElements", "<!DOCTYPE plist [<!ELEMENT plist ANY>]><plist><true/></plist>", true},
      {"attributeInSingleQuotes", "<plist version='1.0'><true/></plist>", true},
      {"latin1", declared + "ISO-8859-1\"?><plist><string>\xe9\xff</string></plist>", "\u00e9\u00ff"},
      {"ascii", declared + "US-ASCII\"?><plist><string>e</string></plist>", "e"},
      {"utf16LittleEnd", inUTF16(list, false), "\u00e9\u4e2d\U0001f3a5"},
      {"utf16BigEnd", inUTF16(list, true), "\u00e9\u4e2d\U0001f3a5"},
      {"utf16Declared", inUTF16(u"<?xml version='1.0' encoding='UTF-16'?><plist><true/></plist>", false), true},
  };
}

std::string nameOf(const testing::TestParamInfo<Accepted>& info) {
  return info.param.name;
}

INSTANTIATE_TEST_SUITE_P(Integers, AcceptedDocument, testing::ValuesIn(integers()), nameOf);
INSTANTIATE_TEST_SUITE_P(Reals, AcceptedDocument, testing::ValuesIn(reals()), nameOf);
INSTANTIATE_TEST_SUITE_P(Strings, AcceptedDocument, testing::ValuesIn(strings()), nameOf);
INSTANTIATE_TEST_SUITE_P(OtherValues, AcceptedDocument, testing::ValuesIn(otherValues()), nameOf);
INSTANTIATE_TEST_SUITE_P(Collections, AcceptedDocument, testing::ValuesIn(collections()), nameOf);
INSTANTIATE_TEST_SUITE_P(Documents, AcceptedDocument, testing::ValuesIn(documents()), nameOf);

TEST(PropertyListReader, keepsTheOrderOfKeys_whenTheyAreNotSorted) {
  const auto dictionary = dictionaryWithXMLDescription(
      documentOf("<dict><key>b</key><true/><key>a</key><true/><key>c</key><true/></dict>"));
  ASSERT_TRUE(dictionary);
  EXPECT_EQ(Value(*dictionary).description(), "{b: 1, a: 1, c: 1}");
}

TEST(PropertyListReader, keepsTheLastValueInTheFirstPlace_whenAKeyIsRepeated) {
  const auto dictionary = dictionaryWithXMLDescription(
      documentOf("<dict><key>a</key><integer>1</integer><key>b</key><integer>2</integer>"
                 "<key>a</key><integer>3</integer><key>a</key><integer>4</integer></dict>"));
  ASSERT_TRUE(dictionary);
  EXPECT_EQ(Value(*dictionary).description(), "{a: 4, b: 2}");
}

TEST(PropertyListReader, keepsTheSignOfZero_whenARealIsMinusZero) {
  EXPECT_TRUE(std::signbit(*valueWithXMLDescription(documentOf("<real>-0.0</real>"))->real()));
  EXPECT_FALSE(std::signbit(*valueWithXMLDescription(documentOf("<real>0.0</real>"))->real()));
}

TEST(PropertyListReader, givesTheDictionary_whenTheRootIsOne) {
  LMRErrorRef error = LMRError::make("old", 1, "old");
  const std::string document = documentOf("<dict><key>a</key><true/></dict>");
  EXPECT_EQ(dictionaryWithXMLDescription(document), Dictionary({{"a", true}}));
  EXPECT_EQ(dictionaryWithXMLDescription_error(document, &error), Dictionary({{"a", true}}));
  EXPECT_EQ(error, nullptr);
}

} // namespace
