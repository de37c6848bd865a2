#include "ClientTest.h"
#include "support/ChildProgram.h"
#include "support/SystemBus.h"

using lumora::Dictionary;
using lumora::tests::ChildProgram;
using lumora::tests::ClientProcess;
using lumora::tests::FailedWith;
using lumora::tests::SystemBus;
using testing::HasSubstr;

namespace {

/// With a helper agent on a bus of its own.
class PrivilegedTest : public lumora::tests::ClientTest {
protected:
  void SetUp() override {
    if (const auto obstacle = SystemBus::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(bus_.start());
    agent_ = ChildProgram::start({LUMORA_SANDBOX_PROGRAM, "agent", server_.root().string(), "--authority", "owner"});
    ASSERT_TRUE(agent_ && agent_->readLine() == "ready");
  }

  SystemBus bus_;
  std::unique_ptr<ChildProgram> agent_;
};

TEST_F(PrivilegedTest, configSet_changesASetting) {
  EXPECT_EQ(output({"config", "set", "Capture", "very high"}), "Capture is now very high.\n");
  EXPECT_EQ(agent_->readLine(), "setconfig");
  EXPECT_EQ(output({"config", "get", "Capture"}), "very high\n");
  EXPECT_EQ(request(), (lumora::Array{"getconfig", "plist"}));
  EXPECT_EQ(reply({"config", "get"}).string("Capture"), "very high");
  EXPECT_THAT(output({"config", "get"}), HasSubstr("Capture                 very high\n"));
  EXPECT_EQ(reply({"config", "set", "Capture", "low"}).string("Capture"), "low");
  EXPECT_THAT(run({"config", "get", "Nothing"}), FailedWith(1, "\"Nothing\" is not configured."));
  EXPECT_THAT(run({"config", "set", "Nothing", "x"}), FailedWith(12, "Invalid arguments: "));
}

TEST_F(PrivilegedTest, bind_sharesTheCamera_unbindEndsIt) {
  EXPECT_EQ(output({"sharing"}), "This machine's camera is not shared.\n");
  EXPECT_EQ(request(), (lumora::Array{"isbound", "plist"}));
  EXPECT_EQ(output({"bind", "Lectern 🎥"}), "This machine's camera is now shared as Lectern 🎥.\n");
  EXPECT_EQ(agent_->readLine(), "bind");
  EXPECT_EQ(output({"sharing"}), "This machine's camera is shared as Lectern 🎥.\n");
  EXPECT_EQ(reply({"sharing"}), (Dictionary{{"Bound", true}, {"CameraName", "Lectern 🎥"}}));
  EXPECT_EQ(cameraState("Lectern 🎥"), "idle");
  EXPECT_THAT(run({"bind", "Another"}), FailedWith(35, "Couldn't start sharing: "));
  EXPECT_EQ(output({"unbind", "Lectern 🎥"}), "This machine's camera is no longer shared as Lectern 🎥.\n");
  EXPECT_EQ(output({"sharing"}), "This machine's camera is not shared.\n");
  EXPECT_EQ(cameraState("Lectern 🎥"), "");
}

TEST_F(PrivilegedTest, wrongPassword_isRefused) {
  EXPECT_THAT(run({"bind", "A", "--password-file", file("wrong", "pear\n")}), FailedWith(26, "Not authorized: "));
}

TEST_F(PrivilegedTest, agentThatIsNotThere_isUnavailable) {
  agent_.reset();
  EXPECT_THAT(run({"config", "set", "Capture", "x"}), FailedWith(69, "org.vantor.lumagentconfigd"));
}

TEST_F(PrivilegedTest, busThatIsNotThere_isUnavailable) {
  bus_.stop();
  EXPECT_THAT(run({"bind", "A"}), FailedWith(69, "The system bus cannot be reached: "));
}

TEST_F(PrivilegedTest, interrupt_endsTheProgram_whenTheAgentHangs) {
  inject("hang", {"--command", "setconfig"});
  ClientProcess client(commandLine({"config", "set", "Capture", "x"}));
  EXPECT_EQ(agent_->readLine(), "setconfig");
  client.signal(SIGINT);
  EXPECT_EQ(client.wait(), 130);
}

TEST_F(PrivilegedTest, agentThatEndsInMidCall_isUnavailable) {
  inject("hang", {"--command", "setconfig"});
  ClientProcess client(commandLine({"config", "set", "Capture", "x"}));
  EXPECT_EQ(agent_->readLine(), "setconfig");
  agent_->kill();
  EXPECT_EQ(client.wait(), 69);
}

} // namespace
