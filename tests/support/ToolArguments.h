#pragma once

#include <LumoraKit/platform/Value.h>

#include <utility>

namespace lumora::tests {

/// An argument of a tool with a key word and values.
template <class... Values> Value pair(Values&&... values) {
  Array elements;
  (elements.emplace_back(std::forward<Values>(values)), ...);
  return elements;
}

} // namespace lumora::tests
