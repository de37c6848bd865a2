#include "support/Descriptors.h"

#include "Helper.h"

#include <gmock/gmock.h>

#include <fcntl.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

TEST(ToolDescriptors, areTheStandardOnes_whenApplicationHasOthersWithoutCloseOnExec) {
  const int inheritable = open("/dev/null", O_RDONLY); // NOLINT(android-cloexec-open): the point of the test
  const int high = fcntl(inheritable, F_DUPFD, 200);   // NOLINT(android-cloexec-dup)
  EXPECT_EQ(runHelper({"descriptors"}).output, "0 1 2 ");
  close(inheritable);
  close(high);
}

class ClosedStandardDescriptors : public testing::TestWithParam<int> {};

TEST_P(ClosedStandardDescriptors, doNotHurtTheRun) {
  EXPECT_EQ(runHelper({"close-standard", std::to_string(GetParam())}).status, 0);
}

INSTANTIATE_TEST_SUITE_P(EveryCombination, ClosedStandardDescriptors, testing::Range(0, 8));

TEST(ToolDescriptors, areAllClosed_whenRunReturns) {
  run("/bin/true", {});
  const auto before = openDescriptors();
  run("/bin/cat", {}, "input");
  run("/bin/true", {}, std::string(1 << 20, 'x'));
  run("/nowhere/tool", {}, "input");
  runShell("sleep 1 & exit 1");
  EXPECT_EQ(openDescriptors(), before);
}

} // namespace
} // namespace lumora::tests
