#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <string>

namespace lumora {
namespace {

// Standard error first: it cannot fail an assertion of its own, and the log may.
void report(const std::string& line) {
  static std::atomic<bool> reporting{false};
  std::fputs((line + '\n').c_str(), stderr);
  if (!reporting.exchange(true)) {
    if (const auto& log = Platform::current().log) {
      log->write(line);
    }
  }
}

} // namespace

void assertionFailed(std::string_view condition, std::string_view operation, std::string_view unit) {
  std::string line = "Assertion failed: ";
  line.append(condition).append(", in ").append(operation).append(" of ").append(unit);
  report(line);
  std::abort();
}

} // namespace lumora
