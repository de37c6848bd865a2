#include "Caller.h"

#include <gmock/gmock.h>

#include <string>
#include <vector>

// The tests run this program again as callers of the agent.
int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  if (!arguments.empty() && arguments.front() == "--caller") {
    return lumora::tests::runCaller({arguments.begin() + 1, arguments.end()});
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
