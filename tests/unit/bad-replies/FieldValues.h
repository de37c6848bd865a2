#pragma once

#include <LumoraKit/platform/Value.h>

#include <gtest/gtest.h>

#include <chrono>
#include <cmath>
#include <cstdint>
#include <functional>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

namespace lumora::tests {

/// One thing that a field of a reply may hold. The large ones are made only when a test asks for them.
struct FieldValue {
  FieldValue(std::string itsName, Value value)
      : name(std::move(itsName)), make([value = std::move(value)] { return value; }) {}
  FieldValue(std::string itsName, Value (*maker)()) : name(std::move(itsName)), make(maker) {}

  std::string name;
  std::function<Value()> make;
};

inline Value deepArray() {
  Array deep;
  for (int level = 0; level < 1000; ++level) {
    Array outer;
    outer.push_back(std::move(deep));
    deep = std::move(outer);
  }
  return deep;
}

inline Value longArray() {
  return Array(100'000, Value("x"));
}

inline Value longText() {
  return std::string(std::size_t{8} * 1024 * 1024, 'x');
}

/// A value of every type, and some that are absurd.
inline std::vector<FieldValue> fieldValues() {
  return {{"text", "some text"},
          {"emptyText", ""},
          {"integer", -5},
          {"hugeInteger", std::uint64_t{UINT64_MAX}},
          {"real", 2.5},
          {"infinity", HUGE_VAL},
          {"flag", true},
          {"date", Date(std::chrono::seconds(1'263'999'904))},
          {"data", Data{0, 1, 2}},
          {"array", Array{"some text", 1}},
          {"dictionary", Dictionary{{"name", "some text"}}},
          {"deepArray", &deepArray},
          {"longArray", &longArray},
          {"longText", &longText}};
}

inline std::string nameOf(const testing::TestParamInfo<FieldValue>& info) {
  return info.param.name;
}

inline void PrintTo(const FieldValue& field, std::ostream* out) {
  *out << field.name;
}

} // namespace lumora::tests
