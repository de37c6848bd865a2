#include "ServerActionTest.h"

#include <gmock/gmock.h>

#include <algorithm>

using lumora::Array;
using lumora::Value;
using lumora::tests::kerberosSession;
using lumora::tests::pair;
using lumora::tests::passwordSession;
using testing::ElementsAre;

namespace {

class RequestTest : public lumora::tests::ServerActionTest {};

TEST_F(RequestTest, sendsCommandAndArgumentsOnly_whenThereIsNoSession) {
  const auto action = LMRAction::actionWithCommand_arguments("getconfig", Array{"plist"});
  EXPECT_THAT(requestOf(action), ElementsAre("getconfig", "plist"));
}

TEST_F(RequestTest, sendsAddressAndCredentials_whenTheSessionIsByPassword) {
  const auto action = LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, passwordSession());
  EXPECT_THAT(requestOf(action), ElementsAre(pair("server", "lumora.example.org:8170"), pair("auth", "Password"),
                                             pair("user", "alice"), pair("pass", "open sesame"), "listworkflows"));
}

TEST_F(RequestTest, sendsNoUserAndNoPassword_whenTheSessionIsByKerberos) {
  const auto action = LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, kerberosSession());
  EXPECT_THAT(requestOf(action),
              ElementsAre(pair("server", "lumora.example.org:8170"), pair("auth", "Kerberos"), "listworkflows"));
}

TEST_F(RequestTest, sendsKerberos_whenTheTypeIsNotPassword) {
  const auto session = passwordSession();
  session->setAuthenticationType(LMRAuthenticationTypePasswordOrSingleSignOn);
  const auto action = LMRAction::actionWithCommand_arguments_session(std::nullopt, std::nullopt, session);
  EXPECT_THAT(requestOf(action), ElementsAre(pair("server", "lumora.example.org:8170"), pair("auth", "Kerberos")));
}

TEST_F(RequestTest, sendsPortZero_whenTheSessionSaysZero) {
  const auto session = kerberosSession();
  session->setPort(0);
  const auto action = LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, session);
  EXPECT_EQ(requestOf(action).at(0), pair("server", "lumora.example.org:0"));
}

TEST_F(RequestTest, sendsSubcommandAndNoAuth_whenTheToolIsAnother) {
  const auto action = LMRAction::actionWithCommand_arguments_session("workflow", Array{"extra"}, passwordSession());
  action->setTool(std::string(LMRLumoraActionToolPath));
  EXPECT_THAT(requestOf(action), ElementsAre(pair("server", "lumora.example.org:8170"), pair("user", "alice"),
                                             pair("pass", "open sesame"), pair("subcommand", "workflow"), "extra"));
}

TEST_F(RequestTest, isThatOfTheMainTool_whenTheToolIsTheExecTool) {
  const auto action = LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, kerberosSession());
  action->setTool(std::string(LMRLumoraExecToolPath));
  EXPECT_THAT(requestOf(action),
              ElementsAre(pair("server", "lumora.example.org:8170"), pair("auth", "Kerberos"), "listworkflows"));
  EXPECT_EQ(platform_.toolRunner->requests().at(0).executable, "/usr/libexec/lumora/lumexec");
}

TEST_F(RequestTest, startsWithTheArguments_whenThereIsNoCommand) {
  const Array arguments{pair("start", "Studio A"), pair("delay", 5), "audio_only"};
  EXPECT_EQ(requestOf(LMRAction::actionWithCommand_arguments(std::nullopt, arguments)), arguments);
}

TEST_F(RequestTest, endsAPairAtItsKey_whenItsValueIsAbsent) {
  const auto session = passwordSession();
  session->setUserName(std::nullopt);
  session->setPassword(std::nullopt);
  const auto request =
      requestOf(LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, session));
  EXPECT_EQ(request.at(2), pair("user"));
  EXPECT_EQ(request.at(3), pair("pass"));
}

TEST_F(RequestTest, runsTheToolWithItsSwitch) {
  LMRAction::actionWithCommand_arguments("getconfig", std::nullopt)->runSynchronously();
  const auto request = platform_.toolRunner->requests().at(0);
  EXPECT_EQ(request.executable, "/usr/bin/lumctl");
  EXPECT_THAT(request.arguments, ElementsAre("--plistin"));
}

TEST_F(RequestTest, takesTheSessionAsItIsAtTheStart) {
  const auto session = passwordSession();
  const auto action = LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, session);
  session->setUserName("bob");
  EXPECT_EQ(requestOf(action).at(2), pair("user", "bob"));
}

// What no property list can carry.

class UnwritableRequestTest : public RequestTest, public testing::WithParamInterface<std::string> {};

TEST_P(UnwritableRequestTest, failsWithoutRunningATool) {
  const auto session = passwordSession();
  session->setPassword(GetParam());
  const auto action = LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, session);
  action->runSynchronously();
  EXPECT_EQ(platform_.toolRunner->requestCount(), 0U);
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->error()->code(), 11);
  EXPECT_EQ(action->error()->localizedDescription(), "Invalid input");
  EXPECT_EQ(action->error()->userInfo().string("stderr"),
            "Element 4 of the request cannot be written as a property list");
  EXPECT_EQ(action->result(), nullptr);
}

TEST_P(UnwritableRequestTest, logsNothingOfThePassword) {
  const auto session = passwordSession();
  session->setPassword(GetParam());
  LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, session)->runSynchronously();
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("Error 11 for listworkflows: Element 4 of the request cannot be written as a property list"));
}

INSTANTIATE_TEST_SUITE_P(Texts, UnwritableRequestTest,
                         testing::Values(std::string("bell\a"), std::string("zero\0byte", 9), std::string("\xff\xfe"),
                                         std::string("half a character \xe2\x82"), std::string("\xed\xa0\x80")));

} // namespace
