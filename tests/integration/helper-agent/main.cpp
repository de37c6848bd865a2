#include "Agent.h"
#include "Caller.h"

#include <gmock/gmock.h>

#include <string>
#include <vector>

// The tests run this program again as the agent and as its callers.
int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  if (!arguments.empty() && arguments.front() == "--agent") {
    return lumora::tests::runAgent({arguments.begin() + 1, arguments.end()});
  }
  if (!arguments.empty() && arguments.front() == "--caller") {
    return lumora::tests::runCaller({arguments.begin() + 1, arguments.end()});
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
