#include "Requests.h"

#include <LumoraKit/platform/PropertyList.h>

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
