#pragma once

#include "recorder/model/TextTable.h"

#include <cstddef>
#include <initializer_list>
#include <string>
#include <string_view>

namespace recorder {

/// An English text that the table has in all languages: any other literal does not compile.
class Text {
public:
  // Implicit, so that a literal can stand wherever a text is asked for.
  template <std::size_t length> consteval Text(const char (&english)[length]) : index_(find(english)) {}

  const TextEntry& entry() const { return textTable[index_]; }

private:
  static consteval std::size_t find(std::string_view english) {
    for (std::size_t i = 0; i < textTable.size(); ++i) {
      if (textTable[i].english == english) {
        return i;
      }
    }
    throw "the table has no such text";
  }

  std::size_t index_;
};

/// The text for the user in the language of the application (lumora::Application::language), else in English. Any
/// thread.
std::string text(Text english);

/// The same with %1, %2 ... replaced by the arguments.
std::string filled(Text english, std::initializer_list<std::string> arguments);

} // namespace recorder
