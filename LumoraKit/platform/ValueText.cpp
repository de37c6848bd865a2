#include <LumoraKit/platform/ValueText.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <limits>
#include <system_error>

namespace lumora::value_text {
namespace {

struct Signed {
  bool negative;
  std::string_view digits;
};

Signed splitSign(std::string_view text) {
  const bool negative = text.starts_with('-');
  if (negative || text.starts_with('+')) {
    text.remove_prefix(1);
  }
  return {negative, text};
}

bool isDigit(char c) {
  return c >= '0' && c <= '9';
}

std::optional<std::uint64_t> readUnsigned(std::string_view digits) {
  const bool hexadecimal = digits.starts_with("0x") || digits.starts_with("0X");
  if (hexadecimal) {
    digits.remove_prefix(2);
  }
  std::uint64_t number = 0;
  const char* const end = digits.data() + digits.size();
  const auto [stop, error] = std::from_chars(digits.data(), end, number, hexadecimal ? 16 : 10);
  return error == std::errc() && stop == end ? std::optional(number) : std::nullopt;
}

bool equalsIgnoringCase(std::string_view text, std::string_view lowerCase) {
  return std::equal(text.begin(), text.end(), lowerCase.begin(), lowerCase.end(),
                    [](char a, char b) { return (a >= 'A' && a <= 'Z' ? a - 'A' + 'a' : a) == b; });
}

// A field of a date, whose places are fixed.
std::optional<unsigned> readField(std::string_view text, std::size_t at, std::size_t length) {
  const std::string_view digits = text.substr(at, length);
  if (!std::all_of(digits.begin(), digits.end(), isDigit)) {
    return std::nullopt;
  }
  unsigned number = 0;
  std::from_chars(digits.data(), digits.data() + digits.size(), number);
  return number;
}

void appendField(std::string& text, std::int64_t number, std::size_t width) {
  const std::string digits = std::to_string(number);
  text.append(width - std::min(width, digits.size()), '0');
  text += digits;
}

constexpr std::string_view alphabet = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
constexpr std::uint8_t notBase64 = 0xff;
constexpr std::uint8_t space = 0xfe;
constexpr std::uint8_t padding = 0xfd;

constexpr std::array<std::uint8_t, 256> makeDecodingTable() {
  std::array<std::uint8_t, 256> table{};
  table.fill(notBase64);
  for (std::size_t i = 0; i < alphabet.size(); ++i) {
    table[static_cast<std::uint8_t>(alphabet[i])] = static_cast<std::uint8_t>(i);
  }
  for (const char c : {' ', '\t', '\r', '\n'}) {
    table[static_cast<std::uint8_t>(c)] = space;
  }
  table['='] = padding;
  return table;
}

constexpr std::array<std::uint8_t, 256> decodingTable = makeDecodingTable();

// Four letters at a time become three bytes.
class Base64Decoder {
public:
  explicit Base64Decoder(std::size_t letters) { bytes_.reserve(letters / 4 * 3); }

  bool take(char letter) {
    const std::uint8_t code = decodingTable[static_cast<std::uint8_t>(letter)];
    if (code == space) {
      return true;
    }
    if (code == padding) {
      return ++padding_ <= 2;
    }
    if (code == notBase64 || padding_ != 0) {
      return false;
    }
    group_ = group_ << 6 | code;
    if (++letters_ == 4) {
      append(3);
    }
    return true;
  }

  // The unused bits of the last letter must be zero, so that each text of bytes is the only one.
  std::optional<Data> finish() {
    if (letters_ == 0) {
      return padding_ == 0 ? std::optional(std::move(bytes_)) : std::nullopt;
    }
    const std::uint32_t unused = letters_ == 2 ? 0xf : 0x3;
    if (letters_ == 1 || letters_ + padding_ != 4 || (group_ & unused) != 0) {
      return std::nullopt;
    }
    group_ <<= 6 * (4 - letters_);
    append(letters_ - 1);
    return std::move(bytes_);
  }

private:
  void append(unsigned count) {
    for (unsigned i = 0; i < count; ++i) {
      bytes_.push_back(static_cast<std::uint8_t>(group_ >> (16 - 8 * i)));
    }
    group_ = 0;
    letters_ = 0;
  }

  Data bytes_;
  std::uint32_t group_ = 0;
  unsigned letters_ = 0;
  unsigned padding_ = 0;
};

} // namespace

std::optional<Value> readInteger(std::string_view text) {
  const auto [negative, digits] = splitSign(text);
  const std::optional<std::uint64_t> size = readUnsigned(digits);
  if (!size || !negative) {
    return size ? std::optional<Value>(*size) : std::nullopt;
  }
  constexpr std::uint64_t largest = std::uint64_t{1} << 63;
  return *size <= largest ? std::optional<Value>(static_cast<std::int64_t>(0 - *size)) : std::nullopt;
}

std::optional<double> readReal(std::string_view text) {
  const auto [negative, digits] = splitSign(text);
  const double sign = negative ? -1 : 1;
  if (equalsIgnoringCase(digits, "inf") || equalsIgnoringCase(digits, "infinity")) {
    return sign * std::numeric_limits<double>::infinity();
  }
  if (equalsIgnoringCase(text, "nan")) {
    return std::numeric_limits<double>::quiet_NaN();
  }
  if (!digits.starts_with('.') && (digits.empty() || !isDigit(digits.front()))) {
    return std::nullopt;
  }
  double number = 0;
  const char* const end = digits.data() + digits.size();
  const auto [stop, error] = std::from_chars(digits.data(), end, number);
  return error == std::errc() && stop == end ? std::optional(sign * number) : std::nullopt;
}

std::string realText(double number) {
  if (std::isnan(number)) {
    return "nan";
  }
  if (std::isinf(number)) {
    return number < 0 ? "-infinity" : "+infinity";
  }
  std::array<char, 32> digits{};
  const auto [end, error] = std::to_chars(digits.data(), digits.data() + digits.size(), number);
  return {digits.data(), end};
}

std::optional<Date> readDate(std::string_view text) {
  constexpr std::string_view pattern = "dddd-dd-ddTdd:dd:ddZ";
  const auto fits = [](char c, char p) { return p == 'd' ? isDigit(c) : c == p; };
  if (!std::equal(text.begin(), text.end(), pattern.begin(), pattern.end(), fits)) {
    return std::nullopt;
  }
  const auto field = [&](std::size_t at, std::size_t length) { return *readField(text, at, length); };
  const std::chrono::year_month_day day{std::chrono::year(static_cast<int>(field(0, 4))),
                                        std::chrono::month(field(5, 2)), std::chrono::day(field(8, 2))};
  const unsigned hour = field(11, 2);
  const unsigned minute = field(14, 2);
  const unsigned second = field(17, 2);
  if (!day.ok() || day.year() < std::chrono::year(1) || hour > 23 || minute > 59 || second > 59) {
    return std::nullopt;
  }
  return std::chrono::sys_days(day) + std::chrono::hours(hour) + std::chrono::minutes(minute) +
         std::chrono::seconds(second);
}

std::optional<std::string> dateText(Date date, std::string_view separator, std::string_view zone) {
  using namespace std::chrono_literals;
  constexpr Date first = std::chrono::sys_days(1y / 1 / 1);
  constexpr Date end = std::chrono::sys_days(10000y / 1 / 1);
  if (date < first || date >= end) {
    return std::nullopt;
  }
  const auto midnight = std::chrono::floor<std::chrono::days>(date);
  const std::chrono::year_month_day day(midnight);
  const std::chrono::hh_mm_ss time(date - midnight);
  std::string text;
  appendField(text, static_cast<int>(day.year()), 4);
  appendField(text += '-', static_cast<unsigned>(day.month()), 2);
  appendField(text += '-', static_cast<unsigned>(day.day()), 2);
  appendField(text += separator, time.hours().count(), 2);
  appendField(text += ':', time.minutes().count(), 2);
  appendField(text += ':', time.seconds().count(), 2);
  return text += zone;
}

std::optional<Data> readBase64(std::string_view text) {
  Base64Decoder decoder(text.size());
  for (const char letter : text) {
    if (!decoder.take(letter)) {
      return std::nullopt;
    }
  }
  return decoder.finish();
}

void appendBase64(std::string& text, const std::uint8_t* bytes, std::size_t size) {
  for (std::size_t i = 0; i < size; i += 3) {
    const std::size_t count = std::min<std::size_t>(3, size - i);
    std::uint32_t group = 0;
    for (std::size_t j = 0; j < 3; ++j) {
      group = group << 8 | (j < count ? bytes[i + j] : 0U);
    }
    for (std::size_t j = 0; j < 4; ++j) {
      text += j <= count ? alphabet[group >> (18 - 6 * j) & 0x3f] : '=';
    }
  }
}

} // namespace lumora::value_text
