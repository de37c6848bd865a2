#pragma once

#include <LumoraKit/platform/Value.h>

#include <ostream>

/// \file
/// Lets a failed expectation show values as text.

namespace lumora {

inline void PrintTo(const Value& value, std::ostream* out) {
  *out << value.description();
}

inline void PrintTo(const Dictionary& dictionary, std::ostream* out) {
  *out << Value(dictionary).description();
}

} // namespace lumora
