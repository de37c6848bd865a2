#include "AgentTest.h"
#include "support/ValuePrinter.h"

#include <thread>

using lumora::Array;
using lumora::Dictionary;
using lumora::HelperAgentError;
using lumora::Value;
using lumora::tests::FailedWith;
using lumora::tests::SandboxServer;
using lumora::tests::WasSuccessful;

namespace {

class PrivilegedCommandsTest : public lumora::tests::AgentTest {
protected:
  void inject(const std::string& fault, const std::vector<std::string>& arguments) const {
    EXPECT_EQ(server_.administrate({"inject", fault}, arguments).status, 0);
  }

  /// What the agent says to a request that the framework would not make.
  static LMRErrorRef refusalOf(const std::string& command, const Dictionary& request) {
    const auto authorization = authorize();
    LMRErrorRef error;
    KTHelperAgentPerformCommand(std::string(LMRHelperAgentIdentifier), KTHelperAgentDomainSystem,
                                authorization ? &*authorization : nullptr, command, request, &error);
    return error;
  }
};

TEST_F(PrivilegedCommandsTest, changeTheConfiguration) {
  const auto action = set("Capture", "high");
  ASSERT_THAT(action, WasSuccessful());
  EXPECT_EQ(action->result()->string("Capture"), "high");
  EXPECT_EQ(configuration().string("Capture"), "high");
}

TEST_F(PrivilegedCommandsTest, carryEveryText) {
  for (const auto* text : {"a=b", "\"quoted\" & <tagged>", "two\nlines", "講義 🎥", " "}) {
    ASSERT_THAT(set("RecordingVideoInput", text), WasSuccessful());
    EXPECT_EQ(configuration().string("RecordingVideoInput"), text);
  }
}

TEST_F(PrivilegedCommandsTest, shareTheCameraAndEndThat) {
  ASSERT_THAT(bind("Lectern"), WasSuccessful());
  EXPECT_EQ(binding(), (Dictionary{{"Bound", true}, {"CameraName", "Lectern"}}));
  EXPECT_EQ(configuration().string(LMRRemoteRecorderServerHostname), SandboxServer::host);
  const auto list = run(LMRActionFactory::actionToListRemoteCamerasWithSession(session()));
  ASSERT_EQ(list->result()->array(LMRCamerasKey)->size(), 1U);
  EXPECT_THAT(
      run(LMRActionFactory::actionToStartRemoteCamera_afterDelay_audioOnly_session("Lectern", 0, true, session())),
      WasSuccessful());
  EXPECT_THAT(unbind("Lectern"), FailedWith(36, "is recording"));
  EXPECT_THAT(run(LMRActionFactory::actionToCancelRemoteCamera_session("Lectern", session())), WasSuccessful());
  ASSERT_THAT(unbind("Lectern"), WasSuccessful());
  EXPECT_EQ(binding(), (Dictionary{{"Bound", false}}));
}

TEST_F(PrivilegedCommandsTest, failWithTheToolsStatus) {
  const auto stranger = session();
  stranger->setPassword("wrong");
  EXPECT_THAT(bind("Lectern", stranger), FailedWith(26, "wrong user name or password"));
  const auto elsewhere = session();
  elsewhere->setServer("elsewhere.example");
  EXPECT_THAT(bind("Lectern", elsewhere), FailedWith(21, "no server at"));
  EXPECT_THAT(set("Colour", "red"), FailedWith(12, "configuration key"));
  ASSERT_THAT(bind("Lectern"), WasSuccessful());
  EXPECT_THAT(bind("Other"), FailedWith(35, "shared as \"Lectern\" already"));
  EXPECT_THAT(set("CameraName", "Other"), FailedWith(35, "while the camera is shared"));
}

TEST_F(PrivilegedCommandsTest, failAsTheServerWasToldTo) {
  inject("failure", {"--command", "bind", "--status", "35", "--message", "the tunnel is closed", "--times", "1"});
  EXPECT_THAT(bind("Lectern"), FailedWith(35, "the tunnel is closed"));
  EXPECT_EQ(binding(), (Dictionary{{"Bound", false}}));
  inject("crash", {"--command", "bind", "--signal", "9", "--times", "1"});
  EXPECT_THAT(bind("Lectern"), FailedWith(128 + 9, ""));
  inject("garbage", {"--command", "bind"});
  const auto action = bind("Lectern");
  EXPECT_THAT(action, WasSuccessful());
  EXPECT_EQ(action->result(), nullptr);
}

TEST_F(PrivilegedCommandsTest, failWithoutAReplyAndChangeNothing_whenTheAgentIsKilledInMidCall) {
  inject("hang", {"--command", "setconfig"});
  std::shared_ptr<LMRAction> action;
  std::jthread caller([&] { action = set("Capture", "high"); });
  ASSERT_EQ(agent_->readLine(), "setconfig");
  agent_->kill();
  caller.join();
  EXPECT_THAT(action, FailedWith(HelperAgentError::AgentEnded, "ended without a reply"));
  EXPECT_EQ(configuration().string("Capture"), "");
}

TEST_F(PrivilegedCommandsTest, fail_whenThereIsNoAgent) {
  const auto authorization = authorize();
  agent_->kill();
  LMRErrorRef error;
  EXPECT_EQ(authorize(lumora::tests::configureOperation, &error), std::nullopt);
  ASSERT_TRUE(error);
  EXPECT_EQ(error->code(), static_cast<int>(HelperAgentError::NoAgent));
  EXPECT_THAT(run(LMRActionFactory::actionToBindCamera_session_authorization("Lectern", session(), &*authorization)),
              FailedWith(HelperAgentError::NoAgent, "There is no helper agent"));
}

TEST_F(PrivilegedCommandsTest, fail_whenTheAgentWasStartedAgainSinceTheAuthorization) {
  const auto authorization = authorize();
  agent_->kill();
  ASSERT_TRUE(startAgent("owner"));
  EXPECT_THAT(run(LMRActionFactory::actionToBindCamera_session_authorization("Lectern", session(), &*authorization)),
              FailedWith(HelperAgentError::NotAuthorized, "not your authorization"));
}

TEST_F(PrivilegedCommandsTest, loseNothing_whenManyComeAtOnce) {
  const auto authorization = authorize();
  ASSERT_TRUE(authorization);
  std::array<const char*, 4> keys{"Capture", "RecordingVideoInput", "RecordingAudioInput", "RecordingCapturePreset"};
  {
    std::vector<std::jthread> threads;
    for (const auto* const key : keys) {
      for (const auto* const value : {"one", "two", "three", "four"}) {
        threads.emplace_back([&, key, value] {
          EXPECT_THAT(run(LMRActionFactory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization(
                          std::string(value), std::string(key), &*authorization)),
                      WasSuccessful());
        });
      }
    }
  }
  for (const auto* const key : keys) {
    EXPECT_THAT(configuration().string(key).value_or(""), testing::AnyOf("one", "two", "three", "four"));
  }
}

TEST_F(PrivilegedCommandsTest, areTheOnlyOnesThatTheAgentHasPerformed) {
  const auto error = refusalOf("listinfo", {{"subarguments", Array{Value(Array{"server", "localhost:8170"})}}});
  ASSERT_TRUE(error);
  EXPECT_EQ(error->code(), static_cast<int>(HelperAgentError::Refused));
  EXPECT_THAT(error->localizedDescription(), testing::HasSubstr("performs no command named listinfo"));
}

TEST_F(PrivilegedCommandsTest, areRefused_whenTheRequestIsMalformed) {
  for (const auto& request : {Dictionary{}, Dictionary{{"subarguments", "Capture=x"}},
                              Dictionary{{"subarguments", Array{"Capture=x"}}, {"server", "localhost:8170"}},
                              Dictionary{{"subarguments", Array{"Capture=x"}}, {"server", 8170}}}) {
    const auto error = refusalOf("setconfig", request);
    ASSERT_TRUE(error) << lumora::Value(request).description();
    EXPECT_EQ(error->code(), static_cast<int>(HelperAgentError::Refused));
    EXPECT_THAT(error->localizedDescription(), testing::HasSubstr("the request is not as it should be"));
  }
  EXPECT_EQ(configuration().string("Capture"), "");
}

TEST_F(PrivilegedCommandsTest, areNotAuthorized_whenTheOperationIsUnknown) {
  LMRErrorRef error;
  EXPECT_EQ(authorize("org.vantor.lumagentconfigd.everything", &error), std::nullopt);
  ASSERT_TRUE(error);
  EXPECT_EQ(error->code(), static_cast<int>(HelperAgentError::Refused));
}

TEST_F(PrivilegedCommandsTest, haveOneAgentOnly) {
  const auto second = lumora::tests::ChildProgram::start(
      {LUMORA_SANDBOX_PROGRAM, "agent", server_.root().string(), "--authority", "owner"});
  EXPECT_EQ(second->readLine(), "");
  EXPECT_THAT(set("Capture", "high"), WasSuccessful());
}

} // namespace
