#include "Refusals.h"

#include <sandbox/protocol/Request.h>

using namespace lumora;
using namespace lumora::sandbox;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

Refusal refusalOfText(const std::string& text) {
  return refusalOf([&] { parseRequest(text); });
}

} // namespace

TEST(Request, elementsKeepTheirOrder_whenWordsAndArraysAreMixed) {
  const auto elements = parseRequest(textOf({Array{"server", "localhost:8170"}, "listworkflows", Array{"delay", 5}}));
  ASSERT_EQ(elements.size(), 3U);
  EXPECT_EQ(elements[0].word, "server");
  EXPECT_THAT(elements[0].values.value(), ElementsAre(Value("localhost:8170")));
  EXPECT_TRUE(elements[1].isWord());
  EXPECT_EQ(elements[1].word, "listworkflows");
  EXPECT_THAT(elements[2].values.value(), ElementsAre(Value(5)));
}

TEST(Request, oneElementArrayIsNoWord_whenItHasNoValue) {
  const auto elements = parseRequest(textOf(only(Array{"async"})));
  EXPECT_FALSE(elements.front().isWord());
  EXPECT_THAT(elements.front().values.value(), IsEmpty());
}

TEST(Request, isInvalidInput_whenItIsNoPropertyList) {
  for (const auto* text : {"", "listinfo", "<plist version=\"1.0\"><array>", "<array/>", "{ }"}) {
    EXPECT_THAT(refusalOfText(text), IsRefusal(Status::InvalidInput, "not a property list")) << text;
  }
}

TEST(Request, isInvalidInput_whenItIsNoArray) {
  EXPECT_THAT(refusalOfText(xmlDescription(Dictionary{{"server", "localhost:8170"}}).value()),
              IsRefusal(Status::InvalidInput, "not an array"));
  EXPECT_THAT(refusalOfText(xmlDescription(Value("listinfo")).value()),
              IsRefusal(Status::InvalidInput, "not an array"));
}

TEST(Request, isInvalidInput_whenAnElementIsNeitherWordNorArray) {
  for (const auto& element : {Value(5), Value(true), Value(Dictionary{}), Value(Data{1, 2})}) {
    EXPECT_THAT(refusalOfText(textOf({"getconfig", element})),
                IsRefusal(Status::InvalidInput, "element 2 is neither a word nor an array"));
  }
}

TEST(Request, isInvalidInput_whenAnArrayIsEmptyOrHasNoKeyWord) {
  EXPECT_THAT(refusalOfText(textOf(only(Array{}))), IsRefusal(Status::InvalidInput, "element 1 is an empty array"));
  EXPECT_THAT(refusalOfText(textOf(only(Array{5, "x"}))), IsRefusal(Status::InvalidInput, "does not begin with a key"));
}

TEST(Request, isInvalidInput_whenAValueIsNeitherStringNorInteger) {
  for (const auto& value : {Value(true), Value(1.5), Value(Array{"x"}), Value(Dictionary{}), Value(Data{})}) {
    EXPECT_THAT(refusalOfText(textOf(only(Array{"file", value}))),
                IsRefusal(Status::InvalidInput, "neither a string nor an integer"));
  }
}

TEST(Request, reasonHidesTheValues_whenAPasswordIsAmongThem) {
  const auto refusal = refusalOfText(textOf(only(Array{"pass", "geheim", true})));
  EXPECT_EQ(refusal.status(), Status::InvalidInput);
  EXPECT_THAT(refusal.what(), Not(HasSubstr("geheim")));
}
