#pragma once

#include <LumoraKit/platform/PropertyList.h>

#include <gmock/gmock.h>

#include <string>
#include <utility>

#include <sandbox/Status.h>

/// Matchers and shorthands of the request tests.

namespace lumora::sandbox {

/// The refusal that an operation ends with; success when it does not refuse.
template <class Operation> Refusal refusalOf(const Operation& operation) {
  try {
    operation();
  } catch (const Refusal& refusal) {
    return refusal;
  }
  return {Status::Success, "nothing was refused"};
}

MATCHER_P2(IsRefusal, status, reason, "") {
  return testing::ExplainMatchResult(status, arg.status(), result_listener) &&
         testing::ExplainMatchResult(testing::HasSubstr(reason), std::string(arg.what()), result_listener);
}

/// A list of one array. (In braces it would be a copy of the array.)
inline Array only(Array element) {
  return Array(1, Value(std::move(element)));
}

inline std::string textOf(const Array& request) {
  return xmlDescription(request).value();
}

} // namespace lumora::sandbox
