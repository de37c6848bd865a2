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

  // Looks at the storage itself: a call of an exported function is slower, and this runs for every value.
  static bool isCollection(const Value& value) {
    return value.storage_.index() >= static_cast<std::size_t>(Type::Array);
  }

  static void copy(const Value& from, Value& to);
  static void dismantle(Value& value) noexcept;
  static bool equal(const Value& left, const Value& right);
  static bool equal(const Dictionary& left, const Dictionary& right);

private:
  static void copyOne(const Value& from, Value& to, std::vector<Copy>& left);
  static void copyArray(const Array& from, Array& to, std::vector<Copy>& left);
  static void copyDictionary(const Dictionary& from, Dictionary& to, std::vector<Copy>& left);
  static void copyInside(const Value& from, Value& to, std::vector<Copy>& left);
  template <class Visit> static void forEachInside(Value& value, Visit visit);
  static void takeNested(Value& value, std::vector<Value>& taken);
  static bool equalPairs(std::vector<Pair> left);
  static bool equalOne(const Value& left, const Value& right, std::vector<Pair>& inside);
  static bool pairElements(const Array& left, const Array& right, std::vector<Pair>& inside);
  static bool pairEntries(const Dictionary& left, const Dictionary& right, std::vector<Pair>& inside);
};

} // namespace lumora
