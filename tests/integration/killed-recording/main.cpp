// The test program of its own: it also runs itself as the recorder that is to be killed.
#include "Victim.h"

#include <gmock/gmock.h>

#include <string_view>

int main(int argc, char** argv) {
  if (argc == 4 && std::string_view(argv[1]) == recordUntilKilledSwitch) {
    return recordUntilKilled(argv[2], argv[3]);
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
