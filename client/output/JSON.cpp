#include "JSON.h"

#include <glib.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <memory>

namespace lumora::client {

namespace {

std::string codeUnit(unsigned character) {
  std::array<char, 8> text{};
  std::snprintf(text.data(), text.size(), "\\u%04x", character);
  return text.data();
}

std::string escapedByte(char byte) {
  switch (byte) {
  case '"':
    return "\\\"";
  case '\\':
    return "\\\\";
  case '\n':
    return "\\n";
  case '\r':
    return "\\r";
  case '\t':
    return "\\t";
  default:
    const auto code = static_cast<unsigned char>(byte);
    return code < 0x20 || code == 0x7F ? codeUnit(code) : std::string(1, byte);
  }
}

std::string quoted(const std::string& text) {
  const std::unique_ptr<gchar, decltype(&g_free)> valid(
      g_utf8_make_valid(text.data(), static_cast<gssize>(text.size())), &g_free);
  std::string result = "\"";
  for (const char* byte = valid.get(); *byte != '\0'; ++byte) {
    // U+0080 to U+009F, which some terminals obey.
    const bool isControl = *byte == '\xC2' && static_cast<unsigned char>(byte[1]) < 0xA0;
    result += isControl ? codeUnit(static_cast<unsigned char>(*++byte)) : escapedByte(*byte);
  }
  return result + "\"";
}

std::string dateText(Date date) {
  const auto day = std::chrono::floor<std::chrono::days>(date);
  const std::chrono::year_month_day calendar(day);
  const std::chrono::hh_mm_ss time(date - day);
  std::array<char, 64> text{};
  std::snprintf(text.data(), text.size(), "\"%04d-%02u-%02uT%02ld:%02ld:%02ldZ\"", static_cast<int>(calendar.year()),
                static_cast<unsigned>(calendar.month()), static_cast<unsigned>(calendar.day()),
                static_cast<long>(time.hours().count()), static_cast<long>(time.minutes().count()),
                static_cast<long>(time.seconds().count()));
  return text.data();
}

std::string base64(const Data& data) {
  const std::unique_ptr<gchar, decltype(&g_free)> text(g_base64_encode(data.data(), data.size()), &g_free);
  return "\"" + std::string(text.get()) + "\"";
}

std::string realText(double real) {
  if (std::isnan(real)) {
    return "\"NaN\"";
  }
  if (std::isinf(real)) {
    return real < 0 ? "\"-Infinity\"" : "\"Infinity\"";
  }
  return Value(real).description();
}

std::string scalar(const Value& value) {
  switch (value.type()) {
  case Value::Type::String:
    return quoted(*value.string());
  case Value::Type::Boolean:
    return value.boolean().value() ? "true" : "false";
  case Value::Type::Real:
    return realText(value.real().value());
  case Value::Type::Date:
    return dateText(value.date().value());
  case Value::Type::Data:
    return base64(*value.data());
  default:
    return value.description();
  }
}

/// One array or dictionary that is being written.
struct Level {
  const Value& collection;
  std::size_t next = 0;

  bool isDictionary() const { return collection.dictionary() != nullptr; }
  std::size_t size() const { return isDictionary() ? collection.dictionary()->size() : collection.array()->size(); }
};

class Writer {
public:
  std::string write(const Value& value) {
    begin(value);
    while (!levels_.empty()) {
      step();
    }
    return text_ + "\n";
  }

private:
  void begin(const Value& value) {
    const bool isCollection = value.array() != nullptr || value.dictionary() != nullptr;
    if (!isCollection) {
      text_ += scalar(value);
      return;
    }
    levels_.push_back({value});
    text_ += levels_.back().isDictionary() ? '{' : '[';
  }

  void step() {
    Level& level = levels_.back();
    if (level.next == level.size()) {
      return end();
    }
    text_ += level.next == 0 ? "" : ",";
    newLine(levels_.size());
    const std::size_t index = level.next++;
    if (!level.isDictionary()) {
      return begin((*level.collection.array())[index]);
    }
    const auto& [key, value] = *(level.collection.dictionary()->begin() + static_cast<std::ptrdiff_t>(index));
    text_ += quoted(key) + ": ";
    begin(value);
  }

  void end() {
    const Level ended = levels_.back();
    levels_.pop_back();
    if (ended.size() > 0) {
      newLine(levels_.size());
    }
    text_ += ended.isDictionary() ? '}' : ']';
  }

  void newLine(std::size_t depth) {
    // Deeper than anybody reads, the indentation would be most of the text.
    constexpr std::size_t deepest = 40;
    text_ += "\n" + std::string(2 * std::min(depth, deepest), ' ');
  }

  std::vector<Level> levels_;
  std::string text_;
};

} // namespace

std::string json(const Value& value) {
  return Writer().write(value);
}

} // namespace lumora::client
