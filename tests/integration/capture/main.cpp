// The test program of its own: it also runs itself as the recorder that is to be killed.
#include "KilledRecorder.h"

#include <gmock/gmock.h>

#include <string_view>

int main(int argc, char** argv) {
  if (argc == 3 && std::string_view(argv[1]) == lumora::testing::recordUntilKilledSwitch) {
    return lumora::testing::recordUntilKilled(argv[2]);
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
