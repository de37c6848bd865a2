#include "DiscoveryTest.h"
#include "support/Sandbox.h"
#include "support/ServerPanel.h"

using lumora::tests::ChildProgram;
using lumora::tests::SandboxServer;
using lumora::tests::serveUntil;
using testing::ElementsAre;

namespace {

class AnnouncementTest : public lumora::tests::DiscoveryTest {
protected:
  std::unique_ptr<ChildProgram> announce(const std::vector<std::string>& options = {}) const {
    std::vector<std::string> words{LUMORA_SANDBOX_PROGRAM, "announce", server_.root().string()};
    words.insert(words.end(), options.begin(), options.end());
    return ChildProgram::start(words);
  }

  SandboxServer server_;
};

TEST_F(AnnouncementTest, tellsWhereTheServerIs_untilItIsEnded) {
  const auto announcement = announce({"--name", "Sandbox", "--host", "sandbox.local"});
  EXPECT_EQ(announcement->readLine(), "Announced as \"Sandbox\".");
  browse();
  const auto service = find("Sandbox");
  resolve(service);
  EXPECT_EQ(service->textRecord(), (lumora::TextRecord{{"host", "sandbox.local"}, {"port", "8170"}}));
  announcement->kill();
  ASSERT_TRUE(waitFor("-Sandbox"));
  EXPECT_THAT(listener_.told, ElementsAre("+Sandbox", "-Sandbox"));
}

TEST_F(AnnouncementTest, takesTheNextName_whenAnotherServerHasIt) {
  const auto first = announce({"--name", "Sandbox"});
  EXPECT_EQ(first->readLine(), "Announced as \"Sandbox\".");
  const auto second = announce({"--name", "Sandbox", "--host", "another.local"});
  EXPECT_EQ(second->readLine(), "Announced as \"Sandbox #2\".");
}

TEST_F(AnnouncementTest, isMadeAgain_whenTheDaemonIsRestarted) {
  const auto announcement = announce({"--name", "Sandbox"});
  announcement->readLine();
  network_.here().stopDaemon();
  ASSERT_TRUE(network_.here().startDaemon());
  EXPECT_EQ(announcement->readLine(), "Announced as \"Sandbox\".");
}

TEST_F(AnnouncementTest, namesTheMachine_unlessItIsTold) {
  const auto announcement = announce();
  EXPECT_EQ(announcement->readLine().rfind("Announced as \"Sandbox on ", 0), 0U);
}

TEST_F(AnnouncementTest, isListedByThePanel_whichLogsInToIt) {
  const auto announcement = announce({"--name", "Sandbox", "--host", "sandbox.local"});
  lumora::tests::ServerPanel panel(server_);
  ASSERT_TRUE(serveUntil([&] { return panel.user().chooseServer("Sandbox"); }));
  ASSERT_TRUE(serveUntil([&] { return !panel.controller().passwordControlsHidden(); })) << panel.log();
  panel.user().typeUserName(SandboxServer::userName);
  panel.user().typePassword(SandboxServer::password);
  panel.connect();
  ASSERT_TRUE(serveUntil([&] { return panel.controller().loginSession() != nullptr; })) << panel.log();
  EXPECT_EQ(panel.controller().loginSession()->description(), "sandbox.local:8170");
}

} // namespace
