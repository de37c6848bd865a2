#include "Agent.h"

#include <gmock/gmock.h>

#include <string>
#include <vector>

// The tests run this program again as the agent.
int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  if (!arguments.empty() && arguments.front() == "--agent") {
    return lumora::tests::runAgent();
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
