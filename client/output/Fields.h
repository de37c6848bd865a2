#pragma once

#include <LumoraKit/LumoraKit.h>

#include <string>
#include <string_view>
#include <vector>

/// \file
/// Dictionaries as tables and as lists of facts. A cell is printed whole, however long it is.

namespace lumora::client {

/// How an entry of a dictionary is shown.
struct Field {
  std::string_view key;
  std::string_view label;
  std::string (*text)(const Value& value);
};

/// One line an element, under a line of the labels; a column that would be empty is left out. Elements that are no
/// dictionary stand as they are.
std::string table(const Array& rows, const std::vector<Field>& columns);

/// One line an entry, the label before the value: first those of the fields that are there, then all others under
/// their own keys. A dash stands for an empty value.
std::string facts(const Dictionary& entries, const std::vector<Field>& fields);

} // namespace lumora::client
