#include "KerberosTest.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/login/LMRAuthenticationAction.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/RootedToolRunner.h>

#include <cstdlib>

using lumora::Platform;
using lumora::tests::SandboxServer;

namespace {

/// An application on the framework, without a password.
class EpisodeTest : public lumora::tests::KerberosTest {
protected:
  EpisodeTest() {
    auto platform = previous_;
    platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server_.root(), previous_.toolRunner);
    Platform::install(platform);
    ::setenv("XDG_DATA_HOME", (server_.folder() / "data").c_str(), 1);
  }
  ~EpisodeTest() override {
    ::unsetenv("XDG_DATA_HOME");
    Platform::install(previous_);
  }

  static std::shared_ptr<LMRAuthenticationAction> logInToServer() {
    auto login = LMRAuthenticationAction::actionWithServer_port(SandboxServer::host, SandboxServer::port);
    login->runSynchronously();
    return login;
  }

private:
  Platform previous_ = Platform::current();
};

TEST_F(EpisodeTest, isSubmitted_whenTheUserHoldsATicket) {
  ASSERT_TRUE(logIn("ada"));
  const auto login = logInToServer();
  ASSERT_FALSE(login->error()) << login->error()->description();
  EXPECT_EQ(login->session()->userName(), "ada");
  EXPECT_EQ(login->session()->userFullName(), SandboxServer::userFullName);
  const auto list = LMRActionFactory::actionToListWorkflowsWithSession(login->session());
  list->runSynchronously();
  ASSERT_TRUE(list->result());
  EXPECT_EQ(list->result()->array(LMRWorkflowsKey)->size(), 5U);

  const auto file = server_.folder() / "lecture.mov";
  lumora::tests::writeFile(file, "a movie");
  const auto submit = LMRActionFactory::
      actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
          file.string(), "single-video", lumora::Dictionary{{"Title", "Lecture 1"}}, std::nullopt, false, false,
          login->session());
  submit->runSynchronously();
  ASSERT_FALSE(submit->error()) << submit->error()->description();
  ASSERT_EQ(server_.episodes().size(), 1U);
  EXPECT_EQ(server_.episodes().front().string("user"), "ada");
}

TEST_F(EpisodeTest, isRefused_whenTheUserHoldsNone) {
  const auto login = logInToServer();
  ASSERT_TRUE(login->error());
  EXPECT_EQ(login->error()->code(), 26);
  EXPECT_NE(login->error()->userInfo().string("stderr")->find("there is no Kerberos ticket"), std::string::npos);
}

} // namespace
