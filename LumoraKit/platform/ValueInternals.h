#pragma once

#include <LumoraKit/platform/Value.h>

#include <vector>

/// \file
/// How values are copied, compared and destroyed: with a list of what is left to do in place of recursion, so that
/// deep nesting does not overflow a small stack. Not for applications.

namespace lumora {

struct Value::Internals {
  struct Copy {
    const Value* from;
    Value* to;
  };
  struct Pair {
    const Value* left;
    const Value* right;
  };

  static void copy(const Value& from, Value& to);
  static void dismantle(Value& value) noexcept;
  static bool equal(const Value& left, const Value& right);
  static bool equal(const Dictionary& left, const Dictionary& right);

private:
  static bool isCollection(const Value& value);
  static void copyOne(const Value& from, Value& to, std::vector<Copy>& left);
  static void copyArray(const Array& from, Value& to, std::vector<Copy>& left);
  static void copyDictionary(const Dictionary& from, Value& to, std::vector<Copy>& left);
  static void takeCollections(Value& value, std::vector<Value>& taken);
  static bool equalPairs(std::vector<Pair> left);
  static bool equalOne(const Value& left, const Value& right, std::vector<Pair>& inside);
  static bool pairElements(const Array& left, const Array& right, std::vector<Pair>& inside);
  static bool pairEntries(const Dictionary& left, const Dictionary& right, std::vector<Pair>& inside);
};

} // namespace lumora
