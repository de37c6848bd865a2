#include "Helper.h"

#include <gmock/gmock.h>

int main(int argc, char** argv) {
  if (const auto status = lumora::tests::runAsHelper(argc, argv)) {
    return *status;
  }
  testing::InitGoogleMock(&argc, argv);
  return RUN_ALL_TESTS();
}
