#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyListBuilder.h>
#include <LumoraKit/platform/ValueText.h>

#include <algorithm>
#include <array>
#include <iterator>
#include <utility>

namespace lumora {
namespace {

constexpr std::string_view whiteSpace = " \t\r\n";

std::string_view trimmed(std::string_view text) {
  const std::size_t first = text.find_first_not_of(whiteSpace);
  return first == std::string_view::npos ? std::string_view()
                                         : text.substr(first, text.find_last_not_of(whiteSpace) - first + 1);
}

bool isWhiteSpace(std::string_view text) {
  return std::all_of(text.begin(), text.end(), [](char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; });
}

// Long texts are cut, at a character's start, to keep a message readable.
std::string excerpt(std::string_view text) {
  constexpr std::size_t most = 40;
  if (text.size() <= most) {
    return std::string(text);
  }
  std::size_t length = most;
  while (length > 0 && (static_cast<unsigned char>(text[length]) & 0xc0) == 0x80) {
    --length;
  }
  return std::string(text.substr(0, length)) + "...";
}

} // namespace

PropertyListBuilder::PropertyListBuilder(bool dictionaryOnly) : dictionaryOnly_(dictionaryOnly) {}

PropertyListBuilder::Element PropertyListBuilder::elementNamed(std::string_view name) {
  // The usual ones first: this runs for every element.
  static constexpr std::array<std::pair<std::string_view, Element>, 11> elements = {{
      {"key", Element::Key},
      {"string", Element::String},
      {"dict", Element::Dictionary},
      {"array", Element::Array},
      {"integer", Element::Integer},
      {"true", Element::True},
      {"false", Element::False},
      {"real", Element::Real},
      {"date", Element::Date},
      {"data", Element::Data},
      {"plist", Element::PropertyList},
  }};
  for (const auto& [text, element] : elements) {
    if (text == name) {
      return element;
    }
  }
  return Element::Unknown;
}

bool PropertyListBuilder::isCollection(Element element) {
  return element == Element::Array || element == Element::Dictionary;
}

bool PropertyListBuilder::fail(PropertyListError code, std::string text) {
  problem_ = {code, std::move(text)};
  return false;
}

bool PropertyListBuilder::startElement(std::string_view name, const char* const* attributes) {
  const Element element = elementNamed(name);
  if (open_.empty()) {
    return startRoot(element, name, attributes);
  }
  if (!mayStart(element, name)) {
    return false;
  }
  if (*attributes) {
    return fail(PropertyListError::WrongStructure,
                format("the element <%@> has an attribute \"%@\"", {text(name), text(*attributes)}));
  }
  if (isCollection(element)) {
    return open(element);
  }
  leaf_ = element;
  return true;
}

bool PropertyListBuilder::startRoot(Element element, std::string_view name, const char* const* attributes) {
  if (element != Element::PropertyList) {
    return fail(PropertyListError::WrongRoot, format("the document is a <%@>, not a <plist>", {excerpt(name)}));
  }
  for (; *attributes; attributes += 2) {
    if (std::string_view(attributes[0]) != "version" || std::string_view(attributes[1]) != "1.0") {
      return fail(PropertyListError::WrongStructure, format("unexpected attribute %@=\"%@\" of <plist>",
                                                            {excerpt(attributes[0]), excerpt(attributes[1])}));
    }
  }
  return open(element);
}

bool PropertyListBuilder::mayStart(Element element, std::string_view name) {
  if (element == Element::Unknown || element == Element::PropertyList) {
    return fail(PropertyListError::WrongStructure, format("the element <%@> is not allowed here", {excerpt(name)}));
  }
  if (leaf_ != Element::Unknown) {
    return fail(PropertyListError::WrongStructure, format("the element <%@> inside a simple value", {text(name)}));
  }
  switch (open_.back().element) {
  case Element::Dictionary:
    return mayStartInDictionary(element);
  case Element::PropertyList:
    return mayStartAsRoot(element);
  default:
    return element != Element::Key || fail(PropertyListError::WrongStructure, "a key outside a dictionary");
  }
}

bool PropertyListBuilder::mayStartInDictionary(Element element) {
  if (keyIsWaiting()) {
    return element != Element::Key || fail(PropertyListError::WrongStructure, "a key without a value");
  }
  return element == Element::Key || fail(PropertyListError::WrongStructure, "a value without a key");
}

bool PropertyListBuilder::mayStartAsRoot(Element element) {
  if (element == Element::Key) {
    return fail(PropertyListError::WrongStructure, "a key outside a dictionary");
  }
  if (!values_.empty()) {
    return fail(PropertyListError::WrongStructure, "more than one root value");
  }
  return !dictionaryOnly_ || element == Element::Dictionary ||
         fail(PropertyListError::WrongRoot, "the root value is not a dictionary");
}

bool PropertyListBuilder::keyIsWaiting() const {
  return keys_.size() - open_.back().keysMark > values_.size() - open_.back().valuesMark;
}

bool PropertyListBuilder::open(Element element) {
  // The document's own element is one more than the nesting.
  if (open_.size() > propertyListDepthLimit) {
    return fail(PropertyListError::TooDeep, format("nested deeper than %@ levels", {text(propertyListDepthLimit)}));
  }
  open_.push_back({element, values_.size(), keys_.size()});
  return true;
}

bool PropertyListBuilder::characters(std::string_view text) {
  if (leaf_ != Element::Unknown) {
    text_ += text;
    return true;
  }
  return isWhiteSpace(text) || fail(PropertyListError::WrongStructure, "text outside a value");
}

bool PropertyListBuilder::endElement() {
  if (leaf_ == Element::Unknown) {
    return endCollection();
  }
  const bool well = endLeaf();
  leaf_ = Element::Unknown;
  text_.clear();
  return well;
}

bool PropertyListBuilder::endCollection() {
  const Open ended = open_.back();
  if (ended.element == Element::PropertyList) {
    return !values_.empty() || fail(PropertyListError::WrongStructure, "no root value");
  }
  if (ended.element == Element::Dictionary && keyIsWaiting()) {
    return fail(PropertyListError::WrongStructure, "a key without a value");
  }
  open_.pop_back();
  values_.push_back(ended.element == Element::Array ? takeArray(ended) : takeDictionary(ended));
  return true;
}

Value PropertyListBuilder::takeArray(const Open& array) {
  const auto first = values_.begin() + static_cast<std::ptrdiff_t>(array.valuesMark);
  Array elements(std::make_move_iterator(first), std::make_move_iterator(values_.end()));
  values_.erase(first, values_.end());
  return elements;
}

Value PropertyListBuilder::takeDictionary(const Open& dictionary) {
  const auto firstValue = values_.begin() + static_cast<std::ptrdiff_t>(dictionary.valuesMark);
  const auto firstKey = keys_.begin() + static_cast<std::ptrdiff_t>(dictionary.keysMark);
  std::vector<Dictionary::Entry> entries;
  entries.reserve(static_cast<std::size_t>(values_.end() - firstValue));
  for (auto [key, value] = std::pair(firstKey, firstValue); value != values_.end(); ++key, ++value) {
    entries.emplace_back(std::move(*key), std::move(*value));
  }
  values_.erase(firstValue, values_.end());
  keys_.erase(firstKey, keys_.end());
  return Dictionary::fromEntries(std::move(entries));
}

bool PropertyListBuilder::endLeaf() {
  switch (leaf_) {
  case Element::Key:
    keys_.push_back(std::move(text_));
    return true;
  case Element::String:
    values_.emplace_back(std::move(text_));
    return true;
  case Element::True:
  case Element::False:
    return endBoolean(leaf_ == Element::True);
  case Element::Data:
    return add(value_text::readBase64(text_), "Base64", text_);
  default:
    return endNumber(leaf_, trimmed(text_));
  }
}

bool PropertyListBuilder::endNumber(Element element, std::string_view text) {
  switch (element) {
  case Element::Integer:
    return add(value_text::readInteger(text), "a 64-bit integer", text);
  case Element::Real:
    return add(value_text::readReal(text), "a real number", text);
  default:
    return add(value_text::readDate(text), "a date", text);
  }
}

bool PropertyListBuilder::endBoolean(bool flag) {
  if (!text_.empty()) {
    return fail(PropertyListError::BadValue, "a boolean holds text");
  }
  values_.emplace_back(flag);
  return true;
}

template <class T> bool PropertyListBuilder::add(std::optional<T> value, std::string_view what, std::string_view text) {
  if (!value) {
    return fail(PropertyListError::BadValue, format("\"%@\" is not %@", {excerpt(text), std::string(what)}));
  }
  values_.emplace_back(std::move(*value));
  return true;
}

Value PropertyListBuilder::take() {
  return std::move(values_.front());
}

} // namespace lumora
