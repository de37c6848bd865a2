#include "Storer.h"

#include <gmock/gmock.h>

#include <string>
#include <vector>

// The tests run this program again as one of several that store a password.
int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  if (!arguments.empty() && arguments.front() == lumora::tests::storerRole) {
    return lumora::tests::runStorer(arguments);
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
