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
  explicit Secret(std::string text) : text_(std::move(text)) { wipe(text); }
  Secret(const Secret& other) = default;
  Secret(Secret&& other) noexcept : text_(std::move(other.text_)) { wipe(other.text_); }
  Secret& operator=(Secret other) noexcept {
    text_.swap(other.text_);
    return *this;
  }
  ~Secret() { wipe(text_); }

  const std::string& text() const { return text_; }

private:
  std::string text_;
};

} // namespace lumora
