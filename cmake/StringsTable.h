#pragma once

#include <algorithm>
#include <cstddef>
#include <map>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>

/// Reads a strings table: entries `"key" = "text";` with comments (/* */ and //) around them. In both strings \" \\ \n
/// are escapes. \U2026 is kept as its six characters in a key, and refused in a text, which holds the character itself.
class StringsTable {
public:
  using Entries = std::map<std::string, std::string>;

  explicit StringsTable(std::string_view text) : text_(text) {}

  /// Throws std::runtime_error with the line and the reason when it is no table.
  Entries parse() {
    Entries entries;
    for (skipSpace(); !atEnd(); skipSpace()) {
      std::string key = string(true);
      expect('=');
      std::string text = string(false);
      expect(';');
      if (!entries.emplace(std::move(key), std::move(text)).second) {
        fail("a key stands twice");
      }
    }
    return entries;
  }

private:
  [[noreturn]] void fail(const std::string& reason) const {
    const auto line = 1 + std::count(text_.begin(), text_.begin() + static_cast<std::ptrdiff_t>(position_), '\n');
    throw std::runtime_error(std::to_string(line) + ": " + reason);
  }

  bool atEnd() const { return position_ == text_.size(); }
  bool startsWith(std::string_view word) const { return text_.substr(position_).starts_with(word); }

  char next() {
    if (atEnd()) {
      fail("the table ends inside an entry");
    }
    return text_[position_++];
  }

  void skipPast(std::string_view word) {
    const auto found = text_.find(word, position_);
    if (found == std::string_view::npos) {
      fail("a comment without its end");
    }
    position_ = found + word.size();
  }

  void skipSpace() {
    while (!atEnd()) {
      if (startsWith("/*")) {
        skipPast("*/");
      } else if (startsWith("//")) {
        skipPast("\n");
      } else if (std::string_view(" \t\n").find(text_[position_]) != std::string_view::npos) {
        ++position_;
      } else {
        return;
      }
    }
  }

  void expect(char character) {
    skipSpace();
    if (next() != character) {
      --position_;
      fail(std::string("expected ") + character);
    }
  }

  std::string string(bool isKey) {
    expect('"');
    std::string content;
    for (char character = next(); character != '"'; character = next()) {
      if (character == '\n') {
        fail("a string without its end");
      }
      content += character == '\\' ? escaped(isKey) : std::string(1, character);
    }
    if (content.empty()) {
      fail("an empty string");
    }
    return content;
  }

  std::string escaped(bool isKey) {
    switch (next()) {
    case '"':
      return "\"";
    case '\\':
      return "\\";
    case 'n':
      return "\n";
    case 'U':
      if (isKey && startsWith("2026")) {
        return "\\U";
      }
      [[fallthrough]];
    default:
      fail("an escape that is not allowed here");
    }
  }

  std::string_view text_;
  std::size_t position_ = 0;
};
