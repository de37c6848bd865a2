// The test program of its own: it also runs itself as the application that is to be killed.
#include "Submitter.h"

#include <gmock/gmock.h>

#include <string_view>

int main(int argc, char** argv) {
  if (argc == 4 && std::string_view(argv[1]) == submitUntilKilledSwitch) {
    return submitUntilKilled(argv[2], argv[3]);
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
