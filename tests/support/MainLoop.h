#pragma once

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>

#include <chrono>
#include <functional>

namespace lumora::tests {

/// Long enough for the slowest machine under a sanitizer; a test that reaches it has failed.
inline constexpr std::chrono::seconds generousLimit{60};

/// Serves the main thread until the condition holds; false when that took longer than a test may.
inline bool serveUntil(const std::function<bool()>& condition) {
  return Platform::current().mainThread->serveUntil(condition, generousLimit);
}

} // namespace lumora::tests
