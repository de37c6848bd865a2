#pragma once

#include "Request.h"

#include <map>
#include <span>

/// \file
/// Which arguments a command takes, and in which order. Nothing may be missing, out of place, repeated or left over.

namespace lumora::sandbox {

/// One place in a command's arguments.
struct Argument {
  enum class Form {
    /// ("key", text), the text not empty
    Text,
    /// ("key", number)
    Number,
    /// ("key")
    Flag,
    /// key, as a bare word
    Word,
    /// any bare word; `key` only names it
    AnyWord,
  };
  enum class Count { One, Optional, Many };

  Form form;
  std::string_view key;
  Count count = Count::One;
  /// For a text: another key that may stand in this place instead.
  std::string_view otherKey = {};
};

using Grammar = std::vector<Argument>;

/// The arguments of a request by their keys.
class Arguments {
public:
  bool has(std::string_view key) const { return values_.find(key) != values_.end(); }
  /// The one value of a key that the grammar requires.
  const std::string& text(std::string_view key) const { return values_.find(key)->second.front(); }
  std::optional<std::string> optionalText(std::string_view key) const;
  std::vector<std::string> texts(std::string_view key) const;
  std::uint64_t number(std::string_view key) const { return numbers_.find(key)->second; }

  void add(std::string_view key, std::string text) { values_[std::string(key)].push_back(std::move(text)); }
  void addNumber(std::string_view key, std::uint64_t number) { numbers_.emplace(key, number); }

private:
  std::map<std::string, std::vector<std::string>, std::less<>> values_;
  std::map<std::string, std::uint64_t, std::less<>> numbers_;
};

/// Reads the elements as the grammar says; anything else is refused as invalid arguments.
Arguments match(const Grammar& grammar, std::span<const Element> elements);

/// The text of the element ("key", text), which must be the first of the elements and is taken off them. Unlike an
/// argument it may be empty: an empty password is wrong, not malformed.
std::string takeText(std::span<const Element>& elements, std::string_view key);

} // namespace lumora::sandbox
