#include "ScriptedService.h"
#include "Storer.h"

#include <gmock/gmock.h>

#include <string>
#include <vector>

// The tests run this program again as one of several that store a password, and as a service.
int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  if (!arguments.empty() && arguments.front() == lumora::tests::storerRole) {
    return lumora::tests::runStorer(arguments);
  }
  if (!arguments.empty() && arguments.front() == lumora::tests::scriptedServiceRole) {
    return lumora::tests::runScriptedService(arguments);
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
