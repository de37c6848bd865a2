#include "support/Sandbox.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/login/LMRAuthenticationAction.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/RootedToolRunner.h>

#include <gmock/gmock.h>

#include <cstdlib>

using lumora::Dictionary;
using lumora::tests::SandboxServer;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::SizeIs;

namespace {

/// The framework against a server that checks every request.
class SandboxLoginTest : public testing::Test {
protected:
  SandboxLoginTest() {
    auto platform = previous_;
    platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server_.root(), previous_.toolRunner);
    lumora::Platform::install(platform);
    ::setenv("XDG_DATA_HOME", (server_.folder() / "data").c_str(), 1);
  }
  ~SandboxLoginTest() override {
    ::unsetenv("XDG_DATA_HOME");
    lumora::Platform::install(previous_);
  }

  static std::shared_ptr<LMRAuthenticationAction> login(const char* password) {
    auto action = LMRAuthenticationAction::actionWithServer_port_userName_password(SandboxServer::host, 0,
                                                                                   SandboxServer::userName, password);
    action->runSynchronously();
    return action;
  }

  lumora::Platform previous_ = lumora::Platform::current();
  SandboxServer server_;
};

TEST_F(SandboxLoginTest, succeeds_whenThePasswordIsRight) {
  const auto action = login(SandboxServer::password);
  ASSERT_FALSE(action->error()) << action->error()->description();
  EXPECT_EQ(action->session()->userFullName(), SandboxServer::userFullName);
  EXPECT_THAT(action->session()->version().value_or(""), Not(IsEmpty()));
  EXPECT_FALSE(action->session()->isLumoraLibraryServer());
}

TEST_F(SandboxLoginTest, failsAsNotAuthorized_whenThePasswordIsWrong) {
  const auto action = login("wrong horse");
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->error()->code(), 26);
  EXPECT_EQ(action->session(), nullptr);
}

TEST_F(SandboxLoginTest, failsWithTheToolsReason_whenTheFileIsMissingOrCannotBeRead) {
  const auto session = login(SandboxServer::password)->session();
  ASSERT_TRUE(session);
  for (const auto& path : {server_.folder() / "missing.mov", server_.folder()}) {
    const auto action = LMRActionFactory::
        actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
            path.string(), "single-video", Dictionary{{"Title", "Lecture 1"}}, std::nullopt, false, false, session);
    action->runSynchronously();
    ASSERT_TRUE(action->error());
    EXPECT_EQ(action->error()->code(), 33);
    EXPECT_EQ(action->error()->localizedDescription(), "File copy failed");
    EXPECT_THAT(action->error()->userInfo().string("stderr").value_or(""), HasSubstr(path.filename().string()));
  }
  EXPECT_THAT(server_.episodes(), IsEmpty());
}

TEST_F(SandboxLoginTest, submitsAFile_whenLoggedIn) {
  const auto session = login(SandboxServer::password)->session();
  ASSERT_TRUE(session);
  const auto file = server_.folder() / "take.mov";
  lumora::tests::writeFile(file, "not really a movie");
  const auto action = LMRActionFactory::
      actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
          file.string(), "single-video", Dictionary{{"Title", "Lecture 1"}},
          Dictionary{{"RecordingMetadata_DURATION", 12}}, false, false, session);
  action->runSynchronously();
  ASSERT_FALSE(action->error()) << action->error()->userInfo().string("stderr").value_or("");
  EXPECT_THAT(server_.episodes(), SizeIs(1));
}

} // namespace
