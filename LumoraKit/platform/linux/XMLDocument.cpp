#include <LumoraKit/platform/XMLDocument.h>
#include <LumoraKit/platform/XMLText.h>

#include <pugixml.hpp>

#include <algorithm>
#include <sstream>

namespace lumora {
namespace {

// The library writes control characters and broken UTF-8 as they come.
bool canBeWritten(const XMLElement& element) {
  std::string escaped;
  return std::ranges::all_of(
             element.attributes,
             [&](const auto& attribute) { return !xml_text::appendEscaped(escaped, attribute.second); }) &&
         std::ranges::all_of(element.children, canBeWritten);
}

void append(pugi::xml_node parent, const XMLElement& element) {
  pugi::xml_node node = parent.append_child(element.name.c_str());
  for (const auto& [name, value] : element.attributes) {
    node.append_attribute(name.c_str()) = value.c_str();
  }
  for (const auto& child : element.children) {
    append(node, child);
  }
}

} // namespace

std::optional<std::string> xmlDocument(const XMLElement& root) {
  if (!canBeWritten(root)) {
    return std::nullopt;
  }
  pugi::xml_document document;
  append(document.root(), root);
  std::ostringstream text;
  document.save(text, "  ", pugi::format_indent, pugi::encoding_utf8);
  return std::move(text).str();
}

} // namespace lumora
