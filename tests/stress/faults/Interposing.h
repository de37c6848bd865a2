#pragma once

#include "FaultyCalls.h"

#include <atomic>
#include <cerrno>
#include <initializer_list>

#include <dlfcn.h>

/// \file
/// What a definition of one of the system's functions is made of. A library's call arrives there because the program
/// comes before the C library. Compiled without the sanitizers: they call some before they are ready for code of their
/// own.

namespace lumora::tests {

/// The two that are no errno: a part of the data is to be transferred, and no more; the call is to succeed.
constexpr int onlyAPart = 0;
constexpr int none = -1;

/// The error that this call is to fail with, of the ways in which it can.
int faultOf(const char* function, std::initializer_list<int> ways);
/// Whether calls are counted at this moment.
bool isFailing();

/// The function of this name that this program hides. Looked up without a lock and made without code.
class SystemsOwn {
public:
  constexpr explicit SystemsOwn(const char* name) : name_(name) {}

  /// Of the type of the one that hides it.
  template <class Function> Function* like(Function* /*hiding*/) {
    void* found = found_;
    if (!found) {
      found = dlsym(RTLD_NEXT, name_);
      found_ = found;
    }
    return reinterpret_cast<Function*>(found);
  }

private:
  const char* const name_;
  std::atomic<void*> found_ = nullptr;
};

/// What a function that has failed returns.
template <class Result> Result failWith(int error, Result result) {
  errno = error;
  return result;
}

} // namespace lumora::tests

/// The system's own function as `next`, in a function of the same name.
#define SYSTEMS_OWN(function)                                                                                          \
  static constinit SystemsOwn own(#function);                                                                          \
  const auto next = own.like(&::function)

/// Returns when the call is to fail.
#define FAIL_IF(fault, result)                                                                                         \
  if (const int way = (fault); way != none) {                                                                          \
    return failWith(way, result);                                                                                      \
  }

/// Returns when the call of the function is to fail, in one of these ways.
#define MAY_FAIL(function, result, ...) FAIL_IF(faultOf(#function, {__VA_ARGS__}), result)
