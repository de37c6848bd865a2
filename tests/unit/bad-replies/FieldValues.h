#pragma once

#include <LumoraKit/platform/Value.h>

#include <gtest/gtest.h>

#include <chrono>
#include <cmath>
#include <cstdint>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

namespace lumora::tests {

/// One thing that a field of a reply may hold.
struct FieldValue {
  std::string name;
  Value value;
};

/// A value of every type, and some that are absurd.
inline std::vector<FieldValue> fieldValues() {
  Value deep = Array{};
  for (int level = 0; level < 1000; ++level) {
    deep = Array{std::move(deep)};
  }
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
          {"deepArray", std::move(deep)},
          {"longArray", Array(100'000, Value("x"))},
          {"longText", std::string(std::size_t{8} * 1024 * 1024, 'x')}};
}

inline std::string nameOf(const testing::TestParamInfo<FieldValue>& info) {
  return info.param.name;
}

inline void PrintTo(const FieldValue& field, std::ostream* out) {
  *out << field.name;
}

} // namespace lumora::tests
