#include "unit/property-list/Documents.h"

#include <LumoraKit/platform/Log.h>

#include <gmock/gmock.h>

using namespace lumora;
using namespace lumora::tests;

namespace {

struct Place {
  int line;
  int column;
  int byte;
};

struct Refused {
  std::string name;
  std::string text;
  PropertyListError code;
  Place place;
};

void PrintTo(const Refused& refused, std::ostream* out) {
  *out << refused.text.substr(0, 200);
}

class RefusedDocument : public testing::TestWithParam<Refused> {};

TEST_P(RefusedDocument, givesItsCodeAndPlace) {
  const auto& [name, document, code, place] = GetParam();
  LMRErrorRef error;
  EXPECT_FALSE(valueWithXMLDescription(document, &error));
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), PropertyListErrorDomain);
  EXPECT_EQ(static_cast<PropertyListError>(error->code()), code) << text(error);
  EXPECT_EQ(*error->userInfo().find("line"), Value(place.line)) << text(error);
  EXPECT_EQ(*error->userInfo().find("column"), Value(place.column)) << text(error);
  EXPECT_EQ(*error->userInfo().find("byte"), Value(place.byte)) << text(error);
}

constexpr auto NotWellFormed = PropertyListError::NotWellFormed;
constexpr auto WrongStructure = PropertyListError::WrongStructure;
constexpr auto BadValue = PropertyListError::BadValue;
constexpr auto WrongRoot = PropertyListError::WrongRoot;

// A document in one line of ASCII: the column follows from the byte.
Refused at(int byte, std::string name, PropertyListError code, std::string document) {
  return {std::move(name), std::move(document), code, {1, byte + 1, byte}};
}

// A value that is refused at its end tag.
Refused bad(std::string name, std::string_view element, std::string_view content) {
  const std::string opening = "<" + std::string(element) + ">" + std::string(content);
  const std::string document = documentOf(opening + "</" + std::string(element) + ">");
  return at(static_cast<int>(21 + opening.size()), std::move(name), BadValue, document);
}

// The content of a <plist> that is refused so many bytes behind its start.
Refused content(int byte, std::string name, std::string_view text, PropertyListError code = WrongStructure) {
  return at(21 + byte, std::move(name), code, documentOf(text));
}

std::vector<Refused> integers() {
  return {
      bad("integerEmpty", "integer", ""),
      bad("integerSpaces", "integer", "  "),
      bad("integerLetters", "integer", "twelve"),
      bad("integerTrailingLetter", "integer", "12x"),
      bad("integerFraction", "integer", "1.5"),
      bad("integerExponent", "integer", "1e3"),
      bad("integerSpaceInside", "integer", "1 2"),
      bad("integerSpaceAfterSign", "integer", "- 1"),
      bad("integerTwoSigns", "integer", "--1"),
      bad("integerSignsMixed", "integer", "+-1"),
      bad("integerSignOnly", "integer", "-"),
      bad("integerSignBehind", "integer", "1-"),
      bad("integerTooLarge", "integer", "18446744073709551616"),
      bad("integerTooSmall", "integer", "-9223372036854775809"),
      bad("integerFarTooLarge", "integer", "99999999999999999999999999999999999999"),
      bad("hexadecimalEmpty", "integer", "0x"),
      bad("hexadecimalSign", "integer", "0x-1"),
      bad("hexadecimalLetter", "integer", "0xG"),
      bad("hexadecimalTooLarge", "integer", "0x10000000000000000"),
      bad("hexadecimalWithoutZero", "integer", "x10"),
      bad("integerGrouped", "integer", "1,000"),
      bad("integerTrue", "integer", "true"),
  };
}

std::vector<Refused> reals() {
  return {
      bad("realEmpty", "real", ""),
      bad("realLetters", "real", "pi"),
      bad("realComma", "real", "1,5"),
      bad("realTrailingLetter", "real", "1.5f"),
      bad("realPointOnly", "real", "."),
      bad("realTwoPoints", "real", "1.2.3"),
      bad("realExponentOnly", "real", "e5"),
      bad("realExponentWithoutDigits", "real", "1e"),
      bad("realTwoSigns", "real", "+-1.5"),
      bad("realHexadecimal", "real", "0x1p3"),
      bad("realTooLarge", "real", "1e309"),
      bad("realTooSmall", "real", "1e-400"),
      bad("realSignedNaN", "real", "-nan"),
      bad("realNaNWithText", "real", "nan(1)"),
      bad("realInfinityCut", "real", "infin"),
      bad("realSpaceInside", "real", "1 .5"),
  };
}

std::vector<Refused> dates() {
  return {
      bad("dateEmpty", "date", ""),
      bad("dateWithoutTime", "date", "2010-01-20"),
      bad("dateWithoutZone", "date", "2010-01-20T15:04:05"),
      bad("dateOtherZone", "date", "2010-01-20T15:04:05+01:00"),
      bad("dateSmallZone", "date", "2010-01-20T15:04:05z"),
      bad("dateSpaceForT", "date", "2010-01-20 15:04:05Z"),
      bad("dateFraction", "date", "2010-01-20T15:04:05.5Z"),
      bad("dateMonthZero", "date", "2010-00-20T15:04:05Z"),
      bad("dateMonthThirteen", "date", "2010-13-20T15:04:05Z"),
      bad("dateDayZero", "date", "2010-01-00T15:04:05Z"),
      bad("dateDayThirtyTwo", "date", "2010-01-32T15:04:05Z"),
      bad("dateThirtyFirstOfApril", "date", "2010-04-31T15:04:05Z"),
      bad("dateNoLeapYear", "date", "2010-02-29T15:04:05Z"),
      bad("dateNoLeapCentury", "date", "1900-02-29T15:04:05Z"),
      bad("dateHour", "date", "2010-01-20T24:00:00Z"),
      bad("dateMinute", "date", "2010-01-20T15:60:05Z"),
      bad("dateLeapSecond", "date", "2010-12-31T23:59:60Z"),
      bad("dateYearZero", "date", "0000-01-01T00:00:00Z"),
      bad("dateShortYear", "date", "10-01-20T15:04:05Z"),
      bad("dateLongYear", "date", "12010-01-20T15:04:05Z"),
      bad("dateNegativeYear", "date", "-010-01-20T15:04:05Z"),
      bad("dateSignInField", "date", "2010-+1-20T15:04:05Z"),
      bad("dateTrailingText", "date", "2010-01-20T15:04:05Z."),
  };
}

std::vector<Refused> dataAndBooleans() {
  return {
      bad("dataOneLetter", "data", "A"),
      bad("dataUnpadded", "data", "AA"),
      bad("dataHalfPadded", "data", "AA="),
      bad("dataPaddingOnly", "data", "="),
      bad("dataFourPaddings", "data", "===="),
      bad("dataTooMuchPadding", "data", "AA==="),
      bad("dataPaddingAfterGroup", "data", "AAAA="),
      bad("dataPaddingForThree", "data", "AAA=="),
      bad("dataLettersAfterPadding", "data", "AA==AA=="),
      bad("dataLetterInPadding", "data", "AA=A="),
      bad("dataUnusedBitsOfTwo", "data", "AB=="),
      bad("dataUnusedBitsOfThree", "data", "AAB="),
      bad("dataOtherAlphabet", "data", "-_-_"),
      bad("dataPunctuation", "data", "AA*A"),
      bad("dataComma", "data", "AA,A"),
      bad("trueWithText", "true", "1"),
      bad("trueWithSpace", "true", " "),
      bad("falseWithText", "false", "false"),
  };
}

std::vector<Refused> structures() {
  return {
      content(0, "emptyRoot", ""),
      content(1, "spaceRoot", " "),
      content(0, "textRoot", "text"),
      content(7, "twoRoots", "<true/><true/>"),
      content(7, "textAfterRoot", "<true/>text"),
      content(0, "unknownElement", "<null/>"),
      content(0, "unknownElementOfFour", "<bool/>"),
      content(0, "unknownElementOfSix", "<strong/>"),
      content(0, "capitalElement", "<Dict/>"),
      content(0, "prefixedElement", "<a:dict/>"),
      content(0, "plistInside", "<plist><true/></plist>"),
      content(7, "unknownElementInArray", "<array><set/></array>"),
      content(7, "textInArray", "<array>text</array>"),
      content(6, "textInDictionary", "<dict>text</dict>"),
      content(18, "textBetweenKeyAndValue", "<dict><key>a</key>b<true/></dict>"),
      content(0, "keyAsRoot", "<key>a</key>"),
      content(7, "keyInArray", "<array><key>a</key></array>"),
      content(6, "valueWithoutKey", "<dict><true/></dict>"),
      content(25, "secondValueWithoutKey", "<dict><key>a</key><true/><true/></dict>"),
      content(18, "keyWithoutValue", "<dict><key>a</key></dict>"),
      content(18, "keyAfterKey", "<dict><key>a</key><key>b</key></dict>"),
      content(11, "arrayInKey", "<dict><key><array/></key></dict>"),
      content(8, "elementInString", "<string><b/></string>"),
      content(8, "stringInString", "<string><string/></string>"),
      content(9, "elementInInteger", "<integer><true/></integer>"),
      content(6, "elementInTrue", "<true><true/></true>"),
      content(0, "attributeOfString", "<string a='b'>c</string>"),
      content(0, "attributeOfDictionary", "<dict version='1.0'/>"),
      content(0, "spaceAttribute", "<string xml:space='preserve'> </string>"),
      at(0, "otherVersion", WrongStructure, "<plist version='2.0'><true/></plist>"),
      at(0, "otherAttribute", WrongStructure, "<plist name='1.0'><true/></plist>"),
      at(0, "nameSpace", WrongStructure, "<plist xmlns='urn:list'><true/></plist>"),
      at(0, "arrayDocument", WrongRoot, "<array/>"),
      at(0, "dictionaryDocument", WrongRoot, "<dict/>"),
      at(0, "otherDocument", WrongRoot, "<html><plist/></html>"),
      at(0, "capitalDocument", WrongRoot, "<PLIST><true/></PLIST>"),
  };
}

std::vector<Refused> notWellFormed() {
  constexpr auto code = NotWellFormed;
  return {
      at(0, "empty", code, ""),
      at(3, "onlySpace", code, "   "),
      at(0, "onlyText", code, "text"),
      at(0, "json", code, "{\"a\": 1}"),
      at(21, "cutAfterStart", code, "<plist version=\"1.0\">"),
      at(21, "cutInTag", code, "<plist version=\"1.0\"><arr"),
      at(28, "cutInArray", code, "<plist version=\"1.0\"><array>"),
      at(32, "cutInString", code, "<plist version=\"1.0\"><string>abc"),
      at(28, "cutBeforeTheEnd", code, "<plist version=\"1.0\"><true/>"),
      at(28, "cutInEndTag", code, "<plist version=\"1.0\"><true/></plis"),
      at(21, "cutInComment", code, "<plist version=\"1.0\"><!-- a"),
      at(39, "cutInCharacterData", code, "<plist version=\"1.0\"><string><![CDATA[a"),
      at(0, "cutInDeclaration", code, "<?xml version=\"1.0\""),
      at(39, "mismatchedEnd", code, documentOf("<array><string>a</array></string>")),
      at(22, "textBehind", code, "<plist><true/></plist>x"),
      at(22, "secondDocument", code, "<plist><true/></plist><plist><true/></plist>"),
      at(22, "nullBehind", code, std::string("<plist><true/></plist>\0", 23)),
      at(1, "declarationNotFirst", code, " <?xml version=\"1.0\"?><plist><true/></plist>"),
      at(15, "nullInside", code, std::string("<plist><string>\0</string></plist>", 33)),
      at(15, "controlCharacter", code, "<plist><string>\x01</string></plist>"),
      at(15, "escapeCharacter", code, "<plist><string>\x1b</string></plist>"),
      at(15, "controlAsReference", code, "<plist><string>&#1;</string></plist>"),
      at(15, "nullAsReference", code, "<plist><string>&#0;</string></plist>"),
      at(15, "surrogateAsReference", code, "<plist><string>&#xD800;</string></plist>"),
      at(15, "nonCharacterAsReference", code, "<plist><string>&#xFFFE;</string></plist>"),
      at(15, "tooLargeReference", code, "<plist><string>&#x110000;</string></plist>"),
      at(15, "unknownEntity", code, "<plist><string>&nbsp;</string></plist>"),
      at(16, "ampersandAlone", code, "<plist><string>& </string></plist>"),
      at(17, "closingBracketsInText", code, "<plist><string>]]></string></plist>"),
      at(15, "loneByte", code, "<plist><string>\xff</string></plist>"),
      at(15, "continuationByteFirst", code, "<plist><string>\x80</string></plist>"),
      at(15, "cutSequence", code, "<plist><string>\xe2\x82</string></plist>"),
      at(15, "overlongSlash", code, "<plist><string>\xc0\xaf</string></plist>"),
      at(15, "overlongNull", code, "<plist><string>\xc0\x80</string></plist>"),
      at(15, "surrogateInUTF8", code, "<plist><string>\xed\xa0\x80</string></plist>"),
      at(15, "beyondUnicode", code, "<plist><string>\xf4\x90\x80\x80</string></plist>"),
      at(15, "nonCharacter", code, "<plist><string>\xef\xbf\xbf</string></plist>"),
      at(30, "unknownEncoding", code, "<?xml version='1.0' encoding='EBCDIC-X'?><plist><true/></plist>"),
      at(14, "attributeNoValue", code, "<plist version><true/></plist>"),
      at(21, "attributeTwice", code, "<plist version='1.0' version='1.0'><true/></plist>"),
      at(56, "asciiWithHighByte", code,
         "<?xml version='1.0' encoding='US-ASCII'?><plist><string>\xe9</string></plist>"),
  };
}

std::vector<Refused> entities() {
  constexpr auto code = NotWellFormed;
  return {
      at(28, "entityDeclared", code, "<!DOCTYPE plist [<!ENTITY a 'b'>]><plist><true/></plist>"),
      at(28, "entityUsed", code, "<!DOCTYPE plist [<!ENTITY a 'b'>]><plist><string>&a;</string></plist>"),
      at(55, "externalEntity", code,
         "<!DOCTYPE plist [<!ENTITY a SYSTEM 'file:///etc/passwd'>]><plist><true/></plist>"),
      at(30, "parameterEntity", code, "<!DOCTYPE plist [<!ENTITY % a 'b'>]><plist><true/></plist>"),
      at(45, "unparsedEntity", code, "<!DOCTYPE plist [<!ENTITY a SYSTEM 'b' NDATA c>]><plist><true/></plist>"),
      at(42, "entityOfTheDocumentType", code, "<!DOCTYPE plist SYSTEM 'a'><plist><string>&a;</string></plist>"),
      at(17, "entityAfterParameterEntity", code, "<!DOCTYPE plist [%a;<!ENTITY b 'c'>]><plist><true/></plist>"),
      at(17, "parameterEntityUsed", code, "<!DOCTYPE plist [%a;]><plist><true/></plist>"),
      at(27, "entityInAttribute", WrongStructure, "<!DOCTYPE plist SYSTEM 'a'><plist version='&a;'><true/></plist>"),
      at(53, "defaultAttribute", WrongStructure,
         "<!DOCTYPE plist [<!ATTLIST true a CDATA 'b'>]><plist><true/></plist>"),
  };
}

std::vector<Refused> places() {
  return {
      {"thirdLine", "<plist>\n<array>\n\t<integer>x</integer>\n</array>\n</plist>", BadValue, {3, 12, 27}},
      {"lineEndsOfTwoCharacters", "<plist>\r\n<array>\r\n<set/></array></plist>", WrongStructure, {3, 1, 18}},
      {"columnsAreCharacters", "<plist><array><string>\u00e9\u00e9\u4e2d</string><set/>", WrongStructure, {1, 35, 38}},
      {"latin1Bytes",
       "<?xml version='1.0' encoding='ISO-8859-1'?><plist><array><string>\xe9</string><set/>",
       WrongStructure,
       {1, 76, 75}},
      {"utf16Bytes", inUTF16(u"<plist>\n<set/></plist>", false), WrongStructure, {2, 1, 18}},
  };
}

std::string nameOf(const testing::TestParamInfo<Refused>& info) {
  return info.param.name;
}

INSTANTIATE_TEST_SUITE_P(Integers, RefusedDocument, testing::ValuesIn(integers()), nameOf);
INSTANTIATE_TEST_SUITE_P(Reals, RefusedDocument, testing::ValuesIn(reals()), nameOf);
INSTANTIATE_TEST_SUITE_P(Dates, RefusedDocument, testing::ValuesIn(dates()), nameOf);
INSTANTIATE_TEST_SUITE_P(DataAndBooleans, RefusedDocument, testing::ValuesIn(dataAndBooleans()), nameOf);
INSTANTIATE_TEST_SUITE_P(Structures, RefusedDocument, testing::ValuesIn(structures()), nameOf);
INSTANTIATE_TEST_SUITE_P(NotWellFormed, RefusedDocument, testing::ValuesIn(notWellFormed()), nameOf);
INSTANTIATE_TEST_SUITE_P(Entities, RefusedDocument, testing::ValuesIn(entities()), nameOf);
INSTANTIATE_TEST_SUITE_P(Places, RefusedDocument, testing::ValuesIn(places()), nameOf);

TEST(PropertyListReader, refusesEveryBeginning_whenADocumentIsCut) {
  const std::string document =
      "<?xml version=\"1.0\"?><plist version=\"1.0\"><dict><key>a</key><array><integer>1</integer><string>\u00e9&amp;"
      "</string><data>AA==</data><!-- b --><date>2010-01-20T15:04:05Z</date><![CDATA[ ]]></array></dict></plist>";
  ASSERT_TRUE(valueWithXMLDescription(document));
  for (std::size_t length = 0; length < document.size(); ++length) {
    EXPECT_FALSE(valueWithXMLDescription(document.substr(0, length))) << length;
  }
}

// Where is not tested: releases of Expat differ in how much of such a text they take for a character.
TEST(PropertyListReader, refusesUTF16_whenASurrogateStandsAlone) {
  const std::u16string_view alone[] = {u"<plist><string>\xd800</string></plist>",
                                       u"<plist><string>\xdc00</string></plist>",
                                       u"<plist><string>\xd83c\xd83c\xdfa5</string></plist>"};
  for (const std::u16string_view document : alone) {
    for (const bool bigEndian : {false, true}) {
      LMRErrorRef error;
      EXPECT_FALSE(valueWithXMLDescription(inUTF16(document, bigEndian), &error));
      ASSERT_NE(error, nullptr);
      EXPECT_EQ(static_cast<PropertyListError>(error->code()), NotWellFormed);
    }
  }
}

TEST(PropertyListReader, refusesUTF16_whenHalfAUnitIsMissing) {
  std::string document = inUTF16(u"<plist><true/></plist>", false);
  ASSERT_TRUE(valueWithXMLDescription(document));
  document.pop_back();
  EXPECT_FALSE(valueWithXMLDescription(document));
}

TEST(PropertyListReader, saysWhereAndWhat_whenADocumentIsRefused) {
  LMRErrorRef error;
  EXPECT_FALSE(valueWithXMLDescription(documentOf("\n<integer>twelve</integer>"), &error));
  EXPECT_EQ(error->localizedDescription(), "Line 2, column 16 (byte 37): \"twelve\" is not a 64-bit integer");
}

TEST(PropertyListReader, cutsTheText_whenABadValueIsLong) {
  LMRErrorRef error;
  EXPECT_FALSE(valueWithXMLDescription(documentOf("<integer>" + repeated("\u00e9", 1000) + "</integer>"), &error));
  EXPECT_THAT(error->localizedDescription(),
              testing::EndsWith("\"" + repeated("\u00e9", 20) + "...\" is not a 64-bit integer"));
}

TEST(PropertyListReader, cutsTheTextBetweenTwoCharacters_whenABadValueIsLong) {
  LMRErrorRef error;
  EXPECT_FALSE(valueWithXMLDescription(documentOf("<real>" + repeated("\u20ac", 1000) + "</real>"), &error));
  EXPECT_THAT(error->localizedDescription(),
              testing::EndsWith("\"" + repeated("\u20ac", 13) + "...\" is not a real number"));
}

TEST(PropertyListReader, refusesTheRoot_whenADictionaryIsAskedForAndItIsAnother) {
  for (const std::string_view root : {"<array/>", "<string/>", "<integer>1</integer>", "<true/>"}) {
    LMRErrorRef error;
    EXPECT_FALSE(dictionaryWithXMLDescription(documentOf(root)));
    EXPECT_FALSE(dictionaryWithXMLDescription_error(documentOf(root), &error));
    ASSERT_NE(error, nullptr);
    EXPECT_EQ(static_cast<PropertyListError>(error->code()), WrongRoot);
    EXPECT_EQ(*error->userInfo().find("byte"), Value(21));
  }
}

TEST(PropertyListReader, doesNotNeedTheError_whenADocumentIsRefused) {
  EXPECT_FALSE(valueWithXMLDescription("<plist>"));
  EXPECT_FALSE(dictionaryWithXMLDescription("<plist>"));
  EXPECT_FALSE(dictionaryWithXMLDescription_error("<plist>", nullptr));
}

} // namespace
