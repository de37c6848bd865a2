#include "Grammar.h"

#include "../Status.h"

namespace lumora::sandbox {

namespace {

[[noreturn]] void refuse(const std::string& reason) {
  throw Refusal(Status::InvalidArguments, reason);
}

std::string quoted(std::string_view text) {
  return '"' + std::string(text) + '"';
}

std::string nameOf(const Argument& argument) {
  switch (argument.form) {
  case Argument::Form::Flag:
    return "the element (" + quoted(argument.key) + ")";
  case Argument::Form::Word:
    return "the word " + quoted(argument.key);
  case Argument::Form::AnyWord:
    return "a word with the " + std::string(argument.key);
  default:
    return "the element (" + quoted(argument.key) + ", ...)" +
           (argument.otherKey.empty() ? "" : " or (" + quoted(argument.otherKey) + ", ...)");
  }
}

/// Whether an element stands for the argument, right or wrong in its values.
bool isMeant(const Argument& argument, const Element& element) {
  switch (argument.form) {
  case Argument::Form::AnyWord:
    return element.isWord();
  case Argument::Form::Word:
    return element.isWord() && element.word == argument.key;
  default:
    return !element.isWord() &&
           (element.word == argument.key || (!argument.otherKey.empty() && element.word == argument.otherKey));
  }
}

const Value& onlyValue(const Element& element) {
  if (element.values->size() != 1) {
    refuse(nameOf(element) + " has " + (element.values->empty() ? "no value" : "more than one value"));
  }
  return element.values->front();
}

const std::string& onlyText(const Element& element) {
  const auto* text = onlyValue(element).string();
  if (text == nullptr) {
    refuse("the value of " + nameOf(element) + " is not a string");
  }
  return *text;
}

const std::string& onlyFilledText(const Element& element) {
  const auto& text = onlyText(element);
  if (text.empty()) {
    refuse("the value of " + nameOf(element) + " is empty");
  }
  return text;
}

std::uint64_t onlyNumber(const Element& element) {
  const auto number = onlyValue(element).unsignedInteger();
  if (!number) {
    refuse("the value of " + nameOf(element) + " is not a number of zero or more");
  }
  return *number;
}

void read(const Argument& argument, const Element& element, Arguments& arguments) {
  switch (argument.form) {
  case Argument::Form::Text:
    arguments.add(element.word, onlyFilledText(element));
    break;
  case Argument::Form::Number:
    arguments.addNumber(element.word, onlyNumber(element));
    break;
  case Argument::Form::Flag:
    if (!element.values->empty()) {
      refuse(nameOf(element) + " takes no value");
    }
    [[fallthrough]];
  case Argument::Form::Word:
    arguments.add(argument.key, {});
    break;
  case Argument::Form::AnyWord:
    arguments.add(argument.key, element.word);
    break;
  }
}

[[noreturn]] void refuseMissing(const Argument& argument, std::span<const Element> elements) {
  refuse(nameOf(argument) + " is missing" +
         (elements.empty() ? "" : ": in its place stands " + nameOf(elements.front())));
}

/// Reads the elements that stand in the argument's place and takes them off.
void readPlace(const Argument& argument, std::span<const Element>& elements, Arguments& arguments) {
  std::size_t taken = 0;
  while (!elements.empty() && isMeant(argument, elements.front())) {
    read(argument, elements.front(), arguments);
    elements = elements.subspan(1);
    ++taken;
    if (argument.count != Argument::Count::Many) {
      break;
    }
  }
  if (taken == 0 && argument.count != Argument::Count::Optional) {
    refuseMissing(argument, elements);
  }
}

} // namespace

std::optional<std::string> Arguments::optionalText(std::string_view key) const {
  return has(key) ? std::optional(text(key)) : std::nullopt;
}

std::vector<std::string> Arguments::texts(std::string_view key) const {
  const auto found = values_.find(key);
  return found == values_.end() ? std::vector<std::string>{} : found->second;
}

Arguments match(const Grammar& grammar, std::span<const Element> elements) {
  Arguments arguments;
  for (const auto& argument : grammar) {
    readPlace(argument, elements, arguments);
  }
  if (!elements.empty()) {
    refuse(nameOf(elements.front()) + " is unknown, repeated or out of place");
  }
  return arguments;
}

std::string takeText(std::span<const Element>& elements, std::string_view key) {
  const Argument argument{Argument::Form::Text, key};
  if (elements.empty() || !isMeant(argument, elements.front())) {
    refuseMissing(argument, elements);
  }
  const std::string& text = onlyText(elements.front());
  elements = elements.subspan(1);
  return text;
}

} // namespace lumora::sandbox
