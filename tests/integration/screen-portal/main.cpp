#include "DesktopShell.h"

#include <gmock/gmock.h>

#include <string>
#include <vector>

// The tests run this program again as the desktop.
int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  if (arguments.size() == 2 && arguments.front() == lumora::tests::desktopShellSwitch) {
    return lumora::tests::runDesktopShell(arguments.back());
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
