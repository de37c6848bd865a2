#include "Helper.h"

#include <gmock/gmock.h>

#include <cerrno>
#include <csignal>
#include <string>
#include <thread>

#include <sys/time.h>
#include <sys/wait.h>

namespace lumora::tests {
namespace {

constexpr std::size_t mebibyte = std::size_t{1} << 20U;

// No two blocks are alike, so that a lost or doubled one shows.
std::string numbered(std::size_t size) {
  std::string text;
  text.reserve(size + 16);
  for (std::size_t i = 0; text.size() < size; ++i) {
    text += std::to_string(i) + '\n';
  }
  text.resize(size);
  return text;
}

TEST(ToolStreams, carryEveryByte) {
  std::string bytes;
  for (int byte = 0; byte < 256; ++byte) {
    bytes += static_cast<char>(byte);
  }
  EXPECT_EQ(run("/bin/cat", {}, bytes).output, bytes);
}

TEST(ToolStreams, areEmpty_whenNothingIsSent) {
  const auto done = run("/bin/cat", {});
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.output, "");
  EXPECT_EQ(done.error, "");
}

TEST(ToolStreams, areComplete_whenInputAndOutputAreLarge) {
  const auto input = numbered(32 * mebibyte);
  const auto done = run("/bin/cat", {}, input);
  EXPECT_EQ(done.status, 0);
  EXPECT_TRUE(done.output == input);
}

TEST(ToolStreams, areComplete_whenInputAndBothOutputsAreLarge) {
  const auto input = numbered(8 * mebibyte + 1);
  const auto done = runHelper({"echo-twice"}, input);
  EXPECT_EQ(done.status, 0);
  EXPECT_TRUE(done.output == input);
  EXPECT_TRUE(done.error == input);
}

TEST(ToolStreams, areComplete_whenOneOutputFillsBeforeTheOther) {
  const auto done = runShell("head -c 3000000 /dev/zero >&2; head -c 5000000 /dev/zero; exit 9");
  EXPECT_EQ(done.status, 9);
  EXPECT_EQ(done.output.size(), 5'000'000U);
  EXPECT_EQ(done.error.size(), 3'000'000U);
}

TEST(ToolStreams, areComplete_forSizesAroundThePipes) {
  for (const std::size_t size : {4095U, 4096U, 4097U, 65535U, 65536U, 65537U, 131072U, 1048576U, 1048577U}) {
    const auto done = runHelper({"emit", std::to_string(size), std::to_string(size - 1)});
    EXPECT_EQ(done.output.size(), size);
    EXPECT_EQ(done.error.size(), size - 1);
  }
}

TEST(ToolStreams, areComplete_whenToolReadsInputLate) {
  const auto input = numbered(2 * mebibyte);
  const auto done = runShell("head -c 2000000 /dev/zero; cat >&2", input);
  EXPECT_EQ(done.output.size(), 2'000'000U);
  EXPECT_TRUE(done.error == input);
}

TEST(ToolStreams, areComplete_whenSignalsInterruptTheCalls) {
  struct sigaction action {};
  struct sigaction previous {};
  action.sa_handler = [](int) {};
  sigaction(SIGALRM, &action, &previous);
  const itimerval often{{0, 500}, {0, 500}};
  setitimer(ITIMER_REAL, &often, nullptr);
  const auto input = numbered(8 * mebibyte);
  const auto done = runHelper({"echo-twice"}, input);
  const itimerval never{};
  setitimer(ITIMER_REAL, &never, nullptr);
  sigaction(SIGALRM, &previous, nullptr);
  EXPECT_EQ(done.status, 0);
  EXPECT_TRUE(done.output == input);
  EXPECT_TRUE(done.error == input);
}

TEST(ToolStreams, leaveInputUnwritten_whenToolEndsWithoutReading) {
  EXPECT_EQ(run("/bin/true", {}, numbered(mebibyte)).status, 0);
}

TEST(ToolStreams, leaveInputUnwritten_whenToolClosesItAndGoesOn) {
  const auto done = runShell("exec <&-; head -c 1000000 /dev/zero; exit 4", numbered(mebibyte));
  EXPECT_EQ(done.status, 4);
  EXPECT_EQ(done.output.size(), 1'000'000U);
}

TEST(ToolStreams, doNotEndTheRun_whenToolClosesOutputsAndGoesOn) {
  EXPECT_EQ(runShell("exec >&- 2>&-; cat >/dev/null; exit 5", numbered(mebibyte)).status, 5);
}

// The grandchild gets away from the tool's process and holds its outputs open for as long as it lives.
class Grandchild : public testing::Test {
protected:
  void TearDown() override {
    if (process_ > 0) {
      kill(process_, SIGKILL);
    }
  }

  bool isAlive() const { return process_ > 0 && kill(process_, 0) == 0; }

  pid_t process_ = 0;
};

TEST_F(Grandchild, doesNotHoldUpTheRun_whenItKeepsOutputsOpen) {
  const auto done = runShell("sleep 600 & echo $!; exit 6");
  process_ = std::stoi(done.output);
  EXPECT_EQ(done.status, 6);
  EXPECT_TRUE(isAlive());
}

TEST_F(Grandchild, takesNothingFromToolsOutput_whenItKeepsOutputsOpen) {
  const auto done = runShell("sleep 600 & echo $!; head -c 60000 /dev/zero; head -c 60000 /dev/zero >&2");
  process_ = std::stoi(done.output);
  EXPECT_EQ(done.output.size(), std::to_string(process_).size() + 1 + 60'000);
  EXPECT_EQ(done.error.size(), 60'000U);
}

TEST_F(Grandchild, doesNotHoldUpTheRun_whenItWritesForEver) {
  const auto done = runShell("yes & echo done >&2");
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.error, "done\n");
}

TEST_F(Grandchild, deliversItsOutput_whenItEndsSoonAfterTheTool) {
  // It waits for the end of its parent, so it always writes after the tool's exit.
  const auto done = runShell(
      "tool=$$; (while [ -d /proc/$tool ] && ! grep -q '^State:.Z' /proc/$tool/status; do :; done 2>/dev/null; "
      "echo late) & exit 0");
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.output, "late\n");
}

TEST(ToolProcess, isReaped_whenRunReturns) {
  run("/bin/true", {});
  run("/nowhere/tool", {});
  EXPECT_EQ(waitpid(-1, nullptr, WNOHANG), -1);
  EXPECT_EQ(errno, ECHILD);
}

} // namespace
} // namespace lumora::tests
