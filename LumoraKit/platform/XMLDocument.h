#pragma once

#include <LumoraKit/platform/Export.h>

#include <optional>
#include <string>
#include <utility>
#include <vector>

/// \file
/// Writes small XML documents (XML 1.0) of elements and attributes, without text content.

namespace lumora {

struct XMLElement {
  std::string name;
  /// Names and values in the order in which they are written.
  std::vector<std::pair<std::string, std::string>> attributes;
  std::vector<XMLElement> children;
};

/// The document with that root: an XML declaration without an encoding, UTF-8, one element a line, indented. Nothing
/// when an attribute's value holds what XML cannot carry (a control character, invalid UTF-8). Any thread.
LUMORA_INTERNAL std::optional<std::string> xmlDocument(const XMLElement& root);

} // namespace lumora
