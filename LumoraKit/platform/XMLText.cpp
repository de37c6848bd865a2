#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/XMLText.h>

#include <array>
#include <cstdint>

namespace lumora::xml_text {
namespace {

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

std::uint8_t byteAt(std::string_view text, std::size_t at) {
  return static_cast<std::uint8_t>(text[at]);
}

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

// How many bytes a sequence has by its first one, and the smallest character that needs as many (RFC 3629).
struct Sequence {
  std::size_t length;
  std::uint32_t smallest;
};

constexpr Sequence sequenceStartingWith(std::uint8_t first) {
  return (first & 0xe0) == 0xc0   ? Sequence{2, 0x80}
         : (first & 0xf0) == 0xe0 ? Sequence{3, 0x800}
         : (first & 0xf8) == 0xf0 ? Sequence{4, 0x10000}
                                  : Sequence{0, 0};
}

bool isXMLCharacter(std::uint32_t character) {
  return character < 0xd800 || (character >= 0xe000 && character < 0xfffe) ||
         (character >= 0x10000 && character <= 0x10ffff);
}

// The length of the well-formed character outside ASCII that stands there, 0 for none that XML can carry.
std::size_t multibyteLength(std::string_view text, std::size_t at) {
  const auto [length, smallest] = sequenceStartingWith(byteAt(text, at));
  if (length == 0 || text.size() - at < length) {
    return 0;
  }
  std::uint32_t character = byteAt(text, at) & (0x7fU >> length);
  for (std::size_t i = 1; i < length; ++i) {
    const std::uint8_t next = byteAt(text, at + i);
    if ((next & 0xc0) != 0x80) {
      return 0;
    }
    character = character << 6 | (next & 0x3fU);
  }
  return character >= smallest && isXMLCharacter(character) ? length : 0;
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
