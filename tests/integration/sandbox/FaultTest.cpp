#include "Requests.h"
#include "ToolProcess.h"

#include <chrono>

using namespace lumora;
using namespace lumora::tests;
using testing::HasSubstr;

namespace {

const Array listUploads{"list_uploads"};
const Array getConfiguration{"getconfig", "plist"};

} // namespace

class InjectedStatus : public testing::TestWithParam<int> {};

TEST_P(InjectedStatus, isTheToolsStatus_whenTheFailureStrikes) {
  const SandboxServer server;
  ASSERT_THAT(
      server.administrate({"inject", "failure"}, {"--status", std::to_string(GetParam()), "--message", "as was asked"}),
      Succeeded());
  EXPECT_THAT(server.request(listUploads), EndedWith(GetParam(), "lumctl: as was asked\n"));
}

INSTANTIATE_TEST_SUITE_P(Documented, InjectedStatus,
                         testing::Values(10, 11, 12, 20, 21, 22, 23, 24, 25, 26, 30, 31, 32, 33, 34, 35, 36, 37));

TEST(Fault, strikesOnlyItsCommand) {
  const SandboxServer server;
  ASSERT_THAT(server.administrate({"inject", "failure"}, {"--command", "getconfig", "--status", "22"}), Succeeded());
  EXPECT_THAT(server.request(listUploads), Succeeded());
  EXPECT_THAT(server.request(getConfiguration), EndedWith(22, ""));
}

TEST(Fault, strikesNoMoreThanItsTimes) {
  const SandboxServer server;
  ASSERT_THAT(server.administrate({"inject", "failure"}, {"--status", "22", "--times", "2"}), Succeeded());
  EXPECT_THAT(server.request(listUploads), EndedWith(22, ""));
  EXPECT_THAT(server.request(listUploads), EndedWith(22, ""));
  EXPECT_THAT(server.request(listUploads), Succeeded());
}

TEST(Fault, replyIsNoPropertyList_whenItIsGarbage) {
  const SandboxServer server;
  ASSERT_THAT(server.administrate({"inject", "garbage"}), Succeeded());
  const auto run = server.request(listUploads);
  EXPECT_THAT(run, Succeeded());
  EXPECT_FALSE(run.standardOutput.empty());
  EXPECT_FALSE(dictionaryWithXMLDescription(run.standardOutput));
}

TEST(Fault, replyIsLate_whenThereIsLatency) {
  const SandboxServer server;
  ASSERT_THAT(server.administrate({"inject", "latency"}, {"--milliseconds", "300"}), Succeeded());
  const auto start = std::chrono::steady_clock::now();
  EXPECT_THAT(server.request(listUploads), Succeeded());
  EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(300));
}

TEST(Fault, toolDiesOfTheSignal_whenItCrashes) {
  const SandboxServer server;
  for (const auto* signal : {"11", "9", "6"}) {
    ASSERT_THAT(server.administrate({"inject", "crash"}, {"--signal", signal, "--times", "1"}), Succeeded());
    const auto run = server.request(listUploads);
    EXPECT_EQ(run.status, 128 + std::stoi(signal));
    EXPECT_EQ(run.standardOutput, "");
  }
  EXPECT_THAT(server.request(listUploads), Succeeded());
}

TEST(Fault, replyIsItsFirstHalf_whenItIsPartial) {
  const SandboxServer server;
  const auto whole = server.request(getConfiguration).standardOutput;
  for (const auto& status : {0, 32}) {
    ASSERT_THAT(server.administrate({"inject", "partial"}, {"--status", std::to_string(status), "--times", "1"}),
                Succeeded());
    const auto run = server.request(getConfiguration);
    EXPECT_EQ(run.status, status);
    EXPECT_EQ(run.standardOutput, whole.substr(0, whole.size() / 2));
  }
}

TEST(Fault, workIsDone_whenTheReplyIsPartial) {
  const SandboxServer server;
  ASSERT_THAT(server.administrate({"inject", "partial"}), Succeeded());
  EXPECT_THAT(server.request({"setconfig", "Capture=high"}, "lumexec"), Succeeded());
  ASSERT_THAT(server.administrate({"inject", "clear"}), Succeeded());
  EXPECT_EQ(replyTo(server.request(getConfiguration)).string("Capture"), "high");
}

TEST(Fault, toolWritesHalfAndNeverEnds_whenItStalls) {
  const SandboxServer server;
  const auto whole = server.request(getConfiguration).standardOutput;
  ASSERT_THAT(server.administrate({"inject", "stall"}), Succeeded());
  const auto output = server.folder() / "output";
  const auto script = writeFile(server.folder() / "script", "#!/bin/sh\nexec '" + server.tool().string() +
                                                                "' --plistin >'" + output.string() + "'\n");
  std::filesystem::permissions(script, std::filesystem::perms::owner_all);
  ToolProcess tool(script, writeFile(server.folder() / "request", xmlDescription(getConfiguration).value()));
  EXPECT_TRUE(waitUntil([&] { return contentOf(output) == whole.substr(0, whole.size() / 2); }));
  EXPECT_TRUE(tool.isRunning());
}

TEST(Fault, isListedUntilCleared) {
  const SandboxServer server;
  ASSERT_THAT(server.administrate({"inject", "hang"}, {"--command", "submit", "--times", "3"}), Succeeded());
  EXPECT_EQ(server.administrate({"inject", "list"}).standardOutput, "1\tsubmit\thang\t0\t3 times\t\n");
  ASSERT_THAT(server.administrate({"inject", "clear"}), Succeeded());
  EXPECT_EQ(server.administrate({"inject", "list"}).standardOutput, "");
}

TEST(Fault, isRefused_whenTheStatusIsNone) {
  const SandboxServer server;
  for (const auto* status : {"0", "256", "x"}) {
    EXPECT_EQ(server.administrate({"inject", "failure"}, {"--status", status}).status, 2) << status;
  }
}

TEST(Fault, isRefused_whenThereIsNoSuchCommand) {
  const SandboxServer server;
  EXPECT_THAT(server.administrate({"inject", "hang"}, {"--command", "sumbit"}), EndedWith(2, "sumbit"));
  EXPECT_THAT(server.administrate({"inject", "hang"}, {"--command", "start"}), Succeeded());
}

TEST(Fault, isRefused_whenATransferCannotMeetIt) {
  const SandboxServer server;
  for (const auto* kind : {"hang", "stall", "partial", "garbage"}) {
    EXPECT_THAT(server.administrate({"inject", kind}, {"--command", "transfer"}), EndedWith(2, "transfer")) << kind;
  }
}
