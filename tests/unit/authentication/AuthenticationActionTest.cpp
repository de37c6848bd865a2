#include "support/MainLoop.h"
#include "support/ToolArguments.h"

#include <LumoraKit/login/LMRAuthenticationAction.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <any>
#include <thread>
#include <vector>

using lumora::Dictionary;
using lumora::fakes::ToolReply;
using lumora::tests::pair;
using lumora::tests::serveUntil;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

struct Target {
  void succeeded(const std::shared_ptr<LMRAuthenticationAction>& action) {
    note("success", action);
    session = action->session();
  }
  void failed(const std::shared_ptr<LMRAuthenticationAction>& action) { note("failure", action); }

  void note(const char* outcome, const std::shared_ptr<LMRAuthenticationAction>& action) {
    outcomes.emplace_back(outcome);
    thread = std::this_thread::get_id();
    wasRunning = action->isRunning();
  }

  std::vector<std::string> outcomes;
  std::shared_ptr<LMRSession> session;
  std::thread::id thread;
  bool wasRunning = true;
};

class AuthenticationActionTest : public testing::Test {
protected:
  using ActionRef = std::shared_ptr<LMRAuthenticationAction>;

  AuthenticationActionTest() {
    connection_ = platform_.notificationCenter->observe(
        LMRAuthenticationActionDidAuthenticateNotification,
        [this](const std::any& object) { announced_.push_back(std::any_cast<std::shared_ptr<LMRSession>>(object)); });
    platform_.toolRunner->reply("listinfo", ToolReply::success({{"server_version", "2.1"}}));
    answerWorkflows({{"user_shortname", "asmith"}, {"user_fullname", "Alice Smith"}, {"server", "Lumora"}});
  }

  void answerWorkflows(const Dictionary& reply) {
    platform_.toolRunner->reply("listworkflows", ToolReply::success(reply));
  }

  static ActionRef passwordLogin() {
    return LMRAuthenticationAction::actionWithServer_port_userName_password("lumora.example.org", 0, "alice",
                                                                            "open sesame");
  }
  static ActionRef singleSignOn() { return LMRAuthenticationAction::actionWithServer_port("lumora.example.org", 0); }

  /// Starts it from the main thread, and serves that until the target has been told.
  void run(const ActionRef& action) {
    action->setFinishTarget_selector(target_, &Target::succeeded);
    action->setErrorTarget_selector(target_, &Target::failed);
    action->start();
    ASSERT_TRUE(serveUntil([this] { return !target_->outcomes.empty(); }));
  }

  lumora::fakes::FakePlatform platform_;
  lumora::Connection connection_;
  std::vector<std::shared_ptr<LMRSession>> announced_;
  std::shared_ptr<Target> target_ = std::make_shared<Target>();
};

// What an action begins with.

TEST_F(AuthenticationActionTest, passwordLogin_beginsWithTheGivenSession) {
  const auto session = passwordLogin()->session();
  EXPECT_EQ(session->server(), "lumora.example.org");
  EXPECT_EQ(session->port(), 8170);
  EXPECT_EQ(session->userName(), "alice");
  EXPECT_EQ(session->userFullName(), "alice");
  EXPECT_EQ(session->password(), "open sesame");
  EXPECT_EQ(session->authenticationType(), LMRAuthenticationTypePassword);
}

TEST_F(AuthenticationActionTest, singleSignOn_isOnPort8170WithType2AndNoCredentials_whenThePortIsZero) {
  const auto session = LMRAuthenticationAction("lumora.example.org", 0).session();
  EXPECT_EQ(session->port(), 8170);
  EXPECT_EQ(session->authenticationType(), 2);
  EXPECT_EQ(session->userName(), std::nullopt);
  EXPECT_EQ(session->userFullName(), std::nullopt);
  EXPECT_EQ(session->password(), std::nullopt);
}

TEST_F(AuthenticationActionTest, port_isKept_whenItIsGiven) {
  EXPECT_EQ(LMRAuthenticationAction("lumora.example.org", 8443).session()->port(), 8443);
  EXPECT_EQ(LMRAuthenticationAction("lumora.example.org", 8443, "alice", "secret").session()->port(), 8443);
}

TEST_F(AuthenticationActionTest, description_saysThatItConnects) {
  EXPECT_EQ(passwordLogin()->description(), "Connecting…");
}

TEST_F(AuthenticationActionTest, setSession_storesACopyThatIsNoLibraryServer) {
  const auto action = singleSignOn();
  const auto session = LMRSession::session();
  session->setServer("elsewhere.example.org");
  session->setIsLumoraLibraryServer(true);
  action->setSession(session);
  EXPECT_NE(action->session(), session);
  EXPECT_EQ(action->session()->server(), "elsewhere.example.org");
  EXPECT_FALSE(action->session()->isLumoraLibraryServer());
}

// What is asked.

TEST_F(AuthenticationActionTest, asksForTheServersInformationThenForTheWorkflows) {
  run(passwordLogin());
  const auto requests = platform_.toolRunner->requests();
  ASSERT_EQ(requests.size(), 2U);
  EXPECT_THAT(requests[0].elements, ElementsAre("listinfo", pair("server", "lumora.example.org:8170")));
  EXPECT_THAT(requests[1].elements, ElementsAre(pair("server", "lumora.example.org:8170"), pair("auth", "Password"),
                                                pair("user", "alice"), pair("pass", "open sesame"), "listworkflows"));
}

TEST_F(AuthenticationActionTest, sendsNoCredentials_whenItIsASingleSignOn) {
  run(singleSignOn());
  EXPECT_THAT(platform_.toolRunner->requests().at(1).elements,
              ElementsAre(pair("server", "lumora.example.org:8170"), pair("auth", "Kerberos"), "listworkflows"));
}

// Success.

TEST_F(AuthenticationActionTest, passwordLogin_keepsTheUserName_whenTheReplyTellsAnother) {
  run(passwordLogin());
  EXPECT_THAT(target_->outcomes, ElementsAre("success"));
  EXPECT_EQ(target_->session->userName(), "alice");
  EXPECT_EQ(target_->session->userFullName(), "Alice Smith");
  EXPECT_EQ(target_->session->version(), "2.1");
}

TEST_F(AuthenticationActionTest, singleSignOn_takesTheUserNameFromTheReply) {
  run(singleSignOn());
  EXPECT_EQ(target_->session->userName(), "asmith");
  EXPECT_EQ(target_->session->userFullName(), "Alice Smith");
}

TEST_F(AuthenticationActionTest, isALibraryServer_whenTheReplySaysSo) {
  answerWorkflows({{"server", "LumoraLibrary"}});
  run(passwordLogin());
  EXPECT_TRUE(target_->session->isLumoraLibraryServer());
}

TEST_F(AuthenticationActionTest, isNoLibraryServer_whenTheReplySaysAnythingElseOrNothing) {
  for (const Dictionary& reply : {Dictionary{{"server", "lumoralibrary"}}, Dictionary{{"server", 1}}, Dictionary()}) {
    answerWorkflows(reply);
    const auto action = passwordLogin();
    action->session()->setIsLumoraLibraryServer(true);
    action->runSynchronously();
    EXPECT_FALSE(action->session()->isLumoraLibraryServer()) << lumora::Value(reply).description();
  }
}

TEST_F(AuthenticationActionTest, losesTheFullName_whenTheReplyHasNone) {
  answerWorkflows({});
  run(passwordLogin());
  EXPECT_THAT(target_->outcomes, ElementsAre("success"));
  EXPECT_EQ(target_->session->userFullName(), std::nullopt);
  EXPECT_EQ(target_->session->userName(), "alice");
}

TEST_F(AuthenticationActionTest, hasNoUserName_whenASingleSignOnIsNotToldAny) {
  answerWorkflows({});
  run(singleSignOn());
  EXPECT_THAT(target_->outcomes, ElementsAre("success"));
  EXPECT_EQ(target_->session->userName(), std::nullopt);
}

TEST_F(AuthenticationActionTest, succeeds_whenNoReplyCanBeDecoded) {
  platform_.toolRunner->reply("listinfo", {0, "", ""});
  platform_.toolRunner->reply("listworkflows", {0, "", ""});
  run(passwordLogin());
  EXPECT_THAT(target_->outcomes, ElementsAre("success"));
  EXPECT_EQ(target_->session->version(), std::nullopt);
  EXPECT_EQ(target_->session->userFullName(), std::nullopt);
}

TEST_F(AuthenticationActionTest, announcesItsSessionBeforeTheTargetIsTold) {
  std::size_t toldBefore = 99;
  const auto observation =
      platform_.notificationCenter->observe("LMRAuthenticationActionDidAuthenticateNotification",
                                            [&](const std::any&) { toldBefore = target_->outcomes.size(); });
  run(passwordLogin());
  EXPECT_THAT(announced_, ElementsAre(target_->session));
  EXPECT_EQ(toldBefore, 0U);
}

// Failure.

TEST_F(AuthenticationActionTest, failsWithTheToolsError_whenTheServerCannotBeReached) {
  platform_.toolRunner->reply("listinfo", ToolReply::failure(21, "unknown host"));
  const auto action = passwordLogin();
  run(action);
  EXPECT_THAT(target_->outcomes, ElementsAre("failure"));
  EXPECT_EQ(action->session(), nullptr);
  EXPECT_EQ(action->error()->domain(), "org.vantor.Lumora");
  EXPECT_EQ(action->error()->code(), 21);
  EXPECT_EQ(action->error()->userInfo().string("stderr"), "unknown host");
}

TEST_F(AuthenticationActionTest, sendsNoPassword_whenTheServerCannotBeReached) {
  platform_.toolRunner->reply("listinfo", ToolReply::failure(21));
  run(passwordLogin());
  EXPECT_THAT(platform_.toolRunner->commands(), ElementsAre("listinfo"));
}

TEST_F(AuthenticationActionTest, endsWithoutSessionAndNotice_whenTheWorkflowsCannotBeListed) {
  platform_.toolRunner->reply("listworkflows", ToolReply::failure(26, "bad password"));
  const auto action = passwordLogin();
  run(action);
  EXPECT_THAT(target_->outcomes, ElementsAre("failure"));
  EXPECT_EQ(action->session(), nullptr);
  EXPECT_EQ(action->error()->code(), 26);
  EXPECT_THAT(announced_, IsEmpty());
}

TEST_F(AuthenticationActionTest, announcesNothing_whenItEndsWithAnError) {
  for (const char* const command : {"listinfo", "listworkflows"}) {
    platform_.toolRunner->replyOnce(command, ToolReply::failure(20));
    passwordLogin()->runSynchronously();
    platform_.toolRunner->replyOnce(command, ToolReply::failure(20));
    singleSignOn()->runSynchronously();
  }
  EXPECT_THAT(announced_, IsEmpty());
}

TEST_F(AuthenticationActionTest, logsNoPassword_whenItFails) {
  platform_.toolRunner->reply("listworkflows", ToolReply::failure(26, "bad password"));
  run(passwordLogin());
  EXPECT_THAT(platform_.log->lines(), testing::Each(Not(HasSubstr("open sesame"))));
  EXPECT_THAT(platform_.log->lines(), Not(IsEmpty()));
}

// Threads and lifetimes.

TEST_F(AuthenticationActionTest, tellsOnTheMainThreadAndIsOver_whenStartedThere) {
  run(passwordLogin());
  EXPECT_EQ(target_->thread, std::this_thread::get_id());
  EXPECT_FALSE(target_->wasRunning);
}

TEST_F(AuthenticationActionTest, doesNotBlockTheCaller_whileTheToolRuns) {
  platform_.toolRunner->block();
  const auto action = passwordLogin();
  action->setFinishTarget_selector(target_, &Target::succeeded);
  action->start();
  ASSERT_TRUE(platform_.toolRunner->waitForRequests(1));
  EXPECT_TRUE(action->isRunning());
  EXPECT_THAT(target_->outcomes, IsEmpty());
  platform_.toolRunner->release();
  ASSERT_TRUE(serveUntil([this] { return !target_->outcomes.empty(); }));
}

TEST_F(AuthenticationActionTest, endsBeforeItReturns_whenRunSynchronously) {
  const auto action = passwordLogin();
  action->setFinishTarget_selector(target_, &Target::succeeded);
  action->runSynchronously();
  EXPECT_THAT(target_->outcomes, ElementsAre("success"));
  EXPECT_THAT(announced_, ElementsAre(action->session()));
}

TEST_F(AuthenticationActionTest, endsBeforeItReturns_whenRunSynchronouslyOnAThreadWithoutAQueue) {
  const auto action = singleSignOn();
  std::jthread([&] { action->runSynchronously(); }).join();
  EXPECT_EQ(action->session()->userName(), "asmith");
}

TEST_F(AuthenticationActionTest, livesUntilItsEnd_whenTheCallerDropsIt) {
  {
    const auto action = passwordLogin();
    action->setFinishTarget_selector(target_, &Target::succeeded);
    action->start();
  }
  ASSERT_TRUE(serveUntil([this] { return !target_->outcomes.empty(); }));
  EXPECT_EQ(target_->session->userFullName(), "Alice Smith");
}

TEST_F(AuthenticationActionTest, tellsNobody_whenTheFinishTargetWasCleared) {
  const auto action = passwordLogin();
  action->setFinishTarget_selector(target_, &Target::succeeded);
  action->start();
  action->setFinishTarget(nullptr);
  ASSERT_TRUE(serveUntil([&] { return !action->isRunning(); }));
  EXPECT_THAT(target_->outcomes, IsEmpty());
}

TEST_F(AuthenticationActionTest, endsQuietly_whenItsSessionIsTakenAwayMeanwhile) {
  const auto action = passwordLogin();
  platform_.toolRunner->setHandler([&](const auto&) {
    action->setSession(nullptr);
    return std::nullopt;
  });
  action->runSynchronously();
  EXPECT_EQ(action->error(), nullptr);
  EXPECT_EQ(action->session(), nullptr);
  EXPECT_THAT(announced_, IsEmpty());
}

} // namespace
