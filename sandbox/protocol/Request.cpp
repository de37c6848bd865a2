#include "Request.h"

#include "../Status.h"

#include <LumoraKit/platform/PropertyList.h>

namespace lumora::sandbox {

namespace {

[[noreturn]] void refuse(const std::string& reason) {
  throw Refusal(Status::InvalidInput, reason);
}

bool isElementValue(const Value& value) {
  return value.string() != nullptr || value.type() == Value::Type::Integer ||
         value.type() == Value::Type::UnsignedInteger;
}

Element elementFromArray(const Array& array, const std::string& place) {
  if (array.empty()) {
    refuse(place + " is an empty array");
  }
  if (array.front().string() == nullptr) {
    refuse(place + " does not begin with a key word");
  }
  Element element{*array.front().string(), std::vector<Value>(array.begin() + 1, array.end())};
  for (const auto& value : *element.values) {
    if (!isElementValue(value)) {
      refuse(place + ", (\"" + element.word + "\", ...), holds a value that is neither a string nor an integer");
    }
  }
  return element;
}

Element elementFrom(const Value& value, std::size_t index) {
  const std::string place = "element " + std::to_string(index + 1);
  if (const auto* word = value.string()) {
    return {*word, std::nullopt};
  }
  if (const auto* array = value.array()) {
    return elementFromArray(*array, place);
  }
  refuse(place + " is neither a word nor an array");
}

} // namespace

std::vector<Element> parseRequest(std::string_view text) {
  LMRErrorRef error;
  const auto value = valueWithXMLDescription(text, &error);
  if (!value) {
    refuse("the request is not a property list: " + (error ? error->localizedDescription() : "no reason given"));
  }
  const auto* array = value->array();
  if (array == nullptr) {
    refuse("the request is not an array");
  }
  std::vector<Element> elements;
  for (std::size_t index = 0; index < array->size(); ++index) {
    elements.push_back(elementFrom((*array)[index], index));
  }
  return elements;
}

std::string nameOf(const Element& element) {
  if (element.isWord()) {
    return "the word \"" + element.word + "\"";
  }
  return "the element (\"" + element.word + (element.values->empty() ? "\")" : "\", ...)");
}

} // namespace lumora::sandbox
