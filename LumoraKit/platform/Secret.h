#pragma once

#include <LumoraKit/platform/Export.h>

#include <string>
#include <utility>

namespace lumora {

/// Overwrites the text's memory, also what lies behind its end, and leaves it empty.
LUMORA_EXPORT void wipe(std::string& text);

/// A text that is overwritten in memory when it dies or is replaced.
class LUMORA_EXPORT Secret {
public:
  /// Takes the text over, and overwrites the argument.
  explicit Secret(std::string text) : text_(std::move(text)) { wipe(text); }
  Secret(const Secret& other) = default;
  Secret(Secret&& other) noexcept : text_(std::move(other.text_)) { wipe(other.text_); }
  /// Takes the other's text over; the old one is overwritten.
  Secret& operator=(Secret other) noexcept {
    text_.swap(other.text_);
    return *this;
  }
  ~Secret() { wipe(text_); }

  /// The text. A copy of it is the caller's to wipe.
  const std::string& text() const { return text_; }

private:
  std::string text_;
};

} // namespace lumora
