#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/UnicodeText.h>
#include <LumoraKit/platform/XMLText.h>

#include <array>
#include <cstdint>

namespace lumora::xml_text {
namespace {

using utf8::byteAt;

enum class Kind : std::uint8_t { Plain, Escaped, Control, Multibyte };

constexpr std::array<Kind, 256> makeKinds() {
  std::array<Kind, 256> kinds{};
  for (std::size_t c = 0; c < kinds.size(); ++c) {
    kinds[c] = c < 0x20 ? Kind::Control : c < 0x80 ? Kind::Plain : Kind::Multibyte;
  }
  kinds['\t'] = kinds['\n'] = Kind::Plain;
  kinds['\r'] = kinds['&'] = kinds['<'] = kinds['>'] = Kind::Escaped;
  return kinds;
}

constexpr std::array<Kind, 256> kinds = makeKinds();

std::string_view escaped(char c) {
  switch (c) {
  case '&':
    return "&amp;";
  case '<':
    return "&lt;";
  case '>':
    return "&gt;";
  default:
    return "&#13;";
  }
}

bool isXMLCharacter(std::uint32_t character) {
  return character != 0xfffe && character != 0xffff;
}

// The length of the well-formed character outside ASCII that stands there, 0 for none that XML can carry.
std::size_t multibyteLength(std::string_view text, std::size_t at) {
  const auto [code, length] = utf8::characterAt(text, at);
  return isXMLCharacter(code) ? length : 0;
}

} // namespace

std::optional<std::string> appendEscaped(std::string& xml, std::string_view text) {
  std::size_t copied = 0;
  for (std::size_t at = 0; at < text.size();) {
    const Kind kind = kinds[byteAt(text, at)];
    if (kind == Kind::Plain) {
      ++at;
      continue;
    }
    if (kind == Kind::Escaped) {
      xml.append(text.substr(copied, at - copied)).append(escaped(text[at]));
      copied = ++at;
      continue;
    }
    const std::size_t length = kind == Kind::Multibyte ? multibyteLength(text, at) : 0;
    if (length == 0) {
      return format("XML cannot carry the byte %@ at offset %@ of a text",
                    {lumora::text(byteAt(text, at)), lumora::text(at)});
    }
    at += length;
  }
  xml.append(text.substr(copied));
  return std::nullopt;
}

} // namespace lumora::xml_text
