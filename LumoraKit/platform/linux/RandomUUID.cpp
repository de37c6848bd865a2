#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Files.h>

#include <array>
#include <cerrno>
#include <cstdint>

#include <sys/random.h>

namespace lumora {
namespace {

using UUIDBytes = std::array<std::uint8_t, 16>;

UUIDBytes randomBytes() {
  UUIDBytes bytes{};
  ssize_t count = 0;
  // The kernel gives up to 256 bytes at once; only on a machine that has just started does it wait for them.
  do {
    count = getrandom(bytes.data(), bytes.size(), 0);
  } while (count < 0 && errno == EINTR);
  assertThat(count == static_cast<ssize_t>(bytes.size()), "getrandom gives bytes", "makeUUIDString", "Files");
  return bytes;
}

bool hyphenStandsBefore(std::size_t byte) {
  return byte == 4 || byte == 6 || byte == 8 || byte == 10;
}

std::string textualForm(const UUIDBytes& bytes) {
  constexpr std::string_view digits = "0123456789ABCDEF";
  std::string text;
  for (std::size_t i = 0; i < bytes.size(); ++i) {
    if (hyphenStandsBefore(i)) {
      text += '-';
    }
    text += digits[bytes[i] >> 4U];
    text += digits[bytes[i] & 0x0FU];
  }
  return text;
}

} // namespace

std::string makeUUIDString() {
  auto bytes = randomBytes();
  // Version 4, variant 10x: RFC 4122, section 4.4.
  bytes[6] = static_cast<std::uint8_t>((bytes[6] & 0x0FU) | 0x40U);
  bytes[8] = static_cast<std::uint8_t>((bytes[8] & 0x3FU) | 0x80U);
  return textualForm(bytes);
}

} // namespace lumora
