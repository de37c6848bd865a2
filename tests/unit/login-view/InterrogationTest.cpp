#include "support/LoginTest.h"

using lumora::Array;
using lumora::Dictionary;
using lumora::TextRecord;
using lumora::fakes::FakeNetService;
using lumora::fakes::ToolReply;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

class LoginViewInterrogationTest : public lumora::tests::LoginViewTest {
protected:
  /// Loads the panel and chooses a discovered service.
  std::shared_ptr<FakeNetService> choose(const std::string& name = "Studio 3") {
    load();
    auto service = platform_.serviceDiscovery->add(name);
    EXPECT_TRUE(panel().chooseServer(name));
    return service;
  }
  std::size_t lookUps() { return platform_.kerberos->lookUpCount(); }
};

// Discovered servers.

TEST_F(LoginViewInterrogationTest, choosing_resolvesTheServiceWithinFiveSeconds) {
  const auto service = choose();
  run();
  EXPECT_EQ(controller_->server(), "Studio 3");
  EXPECT_THAT(service->limits(), ElementsAre(std::chrono::seconds(5)));
  EXPECT_THAT(interrogated(), IsEmpty());
}

TEST_F(LoginViewInterrogationTest, choosing_forgetsATypedPort) {
  load();
  platform_.serviceDiscovery->add("Studio 3");
  panel().typeServer("studio:8171");
  panel().chooseServer("Studio 3");
  EXPECT_EQ(controller_->port(), 0);
}

TEST_F(LoginViewInterrogationTest, resolution_takesHostAndPortFromTheTextRecord) {
  choose()->resolve(TextRecord{{"host", "lumora.example.org"}, {"port", "8171"}});
  run();
  EXPECT_EQ(controller_->currentServerHostname(), "lumora.example.org");
  EXPECT_EQ(controller_->port(), 8171);
  EXPECT_THAT(interrogated(), ElementsAre("lumora.example.org:8171"));
}

TEST_F(LoginViewInterrogationTest, resolution_makesTheBestOfATextRecord) {
  struct Row {
    TextRecord record;
    const char* asked;
  };
  const Row rows[] = {
      {{}, "Studio 3:8170"},
      {{{"host", std::nullopt}, {"port", std::nullopt}}, "Studio 3:8170"},
      {{{"host", ""}, {"port", ""}}, "Studio 3:8170"},
      {{{"host", "\xff\xfe"}, {"port", "\xff"}}, "Studio 3:8170"},
      {{{"host", "lumora.example.org"}}, "lumora.example.org:8170"},
      {{{"port", "8171"}}, "Studio 3:8171"},
      {{{"host", "lumora.example.org"}, {"port", "seven"}}, "lumora.example.org:8170"},
      {{{"host", "lumora.example.org"}, {"port", "73707"}}, "lumora.example.org:8171"},
  };
  for (const Row& row : rows) {
    tools().forgetRequests();
    controller_ = std::make_shared<LMRServerLoginViewController>();
    choose()->resolve(row.record);
    run();
    EXPECT_THAT(interrogated(), ElementsAre(row.asked));
  }
}

TEST_F(LoginViewInterrogationTest, resolution_asksTheServicesName_whenThereIsNoTextRecord) {
  choose()->resolve(std::nullopt);
  run();
  EXPECT_THAT(interrogated(), ElementsAre("Studio 3:8170"));
}

TEST_F(LoginViewInterrogationTest, failedResolution_asksTheServicesNameAndLogs) {
  choose();
  queues_->advance(std::chrono::milliseconds(4999));
  EXPECT_THAT(interrogated(), IsEmpty());
  queues_->advance(std::chrono::milliseconds(1));
  EXPECT_THAT(interrogated(), ElementsAre("Studio 3:8170"));
  EXPECT_THAT(log().lines(),
              Contains("Couldn't resolve selected server 'Studio 3', so just interrogating its name instead"));
}

TEST_F(LoginViewInterrogationTest, typing_resolvesTheServiceOfThatName) {
  load();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().typeServer("Studio 3");
  panel().finishServer();
  EXPECT_TRUE(service->isResolving());
}

TEST_F(LoginViewInterrogationTest, theFirstOfSeveralServicesOfOneName_isResolved) {
  load();
  const auto first = platform_.serviceDiscovery->add("Studio 3");
  const auto second = platform_.serviceDiscovery->add("Studio 3");
  panel().chooseServer("Studio 3");
  EXPECT_TRUE(first->isResolving());
  EXPECT_FALSE(second->isResolving());
}

TEST_F(LoginViewInterrogationTest, aChosenServiceThatWentAway_isAskedByItsName) {
  load();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().chooseServer("Studio 3");
  service->resolve(TextRecord{{"host", "lumora.example.org"}});
  run();
  platform_.serviceDiscovery->remove(service);
  controller_->comboBoxSelectionDidChange(panel().serverComboBox);
  run();
  EXPECT_THAT(interrogated(), ElementsAre("lumora.example.org:8170", "Studio 3:8170"));
}

// The reply. A row is what the server says, what is allowed, and what comes of it.

struct ReplyRow {
  const char* name;
  Dictionary reply;
  LMRAuthenticationType allowed;
  const char* realm;
  LMRAuthenticationType type;
  bool showsFields;
  bool signsOn;
};

void PrintTo(const ReplyRow& row, std::ostream* out) {
  *out << row.name;
}

Dictionary methods(const Array& methods) {
  return {{"http_auth_type", methods}};
}

class LoginViewReplyTest : public LoginViewInterrogationTest, public testing::WithParamInterface<ReplyRow> {};

TEST_P(LoginViewReplyTest, decidesWhatTheServerTakes) {
  const ReplyRow& row = GetParam();
  serverSays(row.reply);
  if (*row.realm) {
    setRealm(row.realm);
  }
  controller_->setAllowedAuthenticationType(row.allowed);
  ask();
  EXPECT_EQ(type(), row.type);
  EXPECT_EQ(areFieldsShown(), row.showsFields);
  EXPECT_EQ(controller_->loginSession() != nullptr, row.signsOn);
}

constexpr auto password = LMRAuthenticationTypePassword;
constexpr auto tickets = LMRAuthenticationTypeSingleSignOn;
constexpr auto both = LMRAuthenticationTypePasswordOrSingleSignOn;
constexpr auto unknown = LMRAuthenticationTypeUnknown;

INSTANTIATE_TEST_SUITE_P(
    Table, LoginViewReplyTest,
    testing::Values(ReplyRow{"missing", {}, both, "R", unknown, false, false},
                    ReplyRow{"aWord", {{"http_auth_type", "kerberos"}}, both, "R", password, true, false},
                    ReplyRow{"aDictionary", {{"http_auth_type", Dictionary()}}, both, "R", password, true, false},
                    ReplyRow{"emptyList", methods({}), both, "R", unknown, false, false},
                    ReplyRow{"otherWords", methods({"ntlm", 5, "Basic"}), both, "R", unknown, false, false},
                    ReplyRow{"basic", methods({"basic"}), both, "R", password, true, false},
                    ReplyRow{"digest", methods({"digest", "ntlm"}), both, "R", password, true, false},
                    ReplyRow{"kerberosInARealm", methods({"kerberos"}), both, "R", tickets, false, true},
                    ReplyRow{"kerberosWithoutARealm", methods({"kerberos"}), both, "", tickets, false, false},
                    ReplyRow{"bothInARealm", methods({"basic", "kerberos"}), both, "R", both, false, true},
                    ReplyRow{"bothWithoutARealm", methods({"kerberos", "digest"}), both, "", both, true, false},
                    ReplyRow{"bothPasswordAllowed", methods({"basic", "kerberos"}), password, "R", both, true, false},
                    ReplyRow{"bothTicketsAllowed", methods({"basic", "kerberos"}), tickets, "", both, false, false},
                    ReplyRow{"kerberosPasswordAllowed", methods({"kerberos"}), password, "R", tickets, false, false},
                    ReplyRow{"basicTicketsAllowed", methods({"basic"}), tickets, "R", password, false, false}),
    [](const auto& row) { return row.param.name; });

TEST_F(LoginViewInterrogationTest, aReplyWithoutMethods_isLoggedAndHidesTheFields) {
  ask();
  serverSays({{"server_version", "2.1"}});
  panel().typeServer("other:8171");
  panel().finishServer();
  run();
  EXPECT_THAT(log().lines(),
              Contains("Warning: Could not determine supported authentication types for Lumora server 'other'"));
  EXPECT_FALSE(areFieldsShown());
  EXPECT_EQ(controller_->currentLoginAction()->error(), nullptr);
}

TEST_F(LoginViewInterrogationTest, aReplyThatCannotBeDecoded_isOneWithoutMethods) {
  tools().reply("listinfo", {0, "<html>not a Lumora server</html>", ""});
  ask();
  EXPECT_EQ(type(), 0);
  EXPECT_TRUE(log().contains("Warning: Could not determine supported authentication types"));
}

TEST_F(LoginViewInterrogationTest, aReplyOfOtherWordsOnly_isAskedForAgainByTheNextConnect) {
  serverTakes({"ntlm"});
  ask();
  connect();
  run();
  EXPECT_EQ(interrogated().size(), 2U);
}

TEST_F(LoginViewInterrogationTest, aFailedInterrogation_hidesTheFieldsAndKeepsTheError) {
  ask();
  tools().reply("listinfo", ToolReply::failure(21, "unknown host"));
  panel().typeServer("other");
  panel().finishServer();
  run();
  EXPECT_FALSE(areFieldsShown());
  EXPECT_EQ(controller_->currentLoginAction()->error()->code(), 21);
  EXPECT_EQ(type(), 0);
}

// The default realm.

TEST_F(LoginViewInterrogationTest, realm_isAskedForOnlyWhenSingleSignOnIsAvailable) {
  ask();
  EXPECT_EQ(lookUps(), 0U);
  EXPECT_FALSE(log().contains("realm"));
  serverTakes({"kerberos"});
  controller_->setAllowedAuthenticationType(password);
  panel().typeServer("other");
  panel().finishServer();
  run();
  EXPECT_EQ(lookUps(), 0U);
}

TEST_F(LoginViewInterrogationTest, realm_isLogged) {
  serverTakes({"kerberos"});
  setRealm("EXAMPLE.ORG");
  ask();
  EXPECT_THAT(log().lines(), Contains("Default kerberos realm name is EXAMPLE.ORG, attempting Single Sign-On"));
}

TEST_F(LoginViewInterrogationTest, realm_isNotUsed_whenItIsEmpty) {
  serverTakes({"kerberos"});
  setRealm("");
  ask();
  EXPECT_THAT(log().lines(), ElementsAre("Could not get default kerberos realm name, not attempting Single Sign-On"));
}

TEST_F(LoginViewInterrogationTest, realm_isNotUsed_whenTheLookUpFails) {
  serverTakes({"kerberos"});
  platform_.kerberos->fail(-1765328160);
  ask();
  EXPECT_THAT(log().lines(), ElementsAre("Could not get default kerberos realm name (error -1765328160), not "
                                         "attempting Single Sign-On"));
}

TEST_F(LoginViewInterrogationTest, kerberosOnlyWithoutARealm_staysHiddenAndConnectSignsOnManually) {
  serverTakes({"kerberos"});
  ask();
  EXPECT_FALSE(areFieldsShown());
  EXPECT_FALSE(log().contains("automatically"));
  connect();
  EXPECT_THAT(log().lines(), Contains("Attempting to manually authenticate to 'studio:0' with Single Sign-On"));
  run();
  EXPECT_EQ(target_->actions.size(), 1U);
}

TEST_F(LoginViewInterrogationTest, basicAndKerberosInARealm_signsOnAtOnceAndFallsBackToThePassword) {
  serverTakes({"basic", "kerberos"});
  setRealm("EXAMPLE.ORG");
  tools().reply("listworkflows", ToolReply::failure(26, "no ticket"));
  ask();
  EXPECT_THAT(log().lines(), Contains("Attempting to automatically authenticate to 'studio:0' with Single Sign-On"));
  EXPECT_THAT(log().lines(), Contains("Failed to automatically authenticate to 'studio'"));
  EXPECT_TRUE(areFieldsShown());
}

// The look-up takes its time. What the user does meanwhile comes first.

class LoginViewSlowRealmTest : public LoginViewInterrogationTest {
protected:
  /// Runs until the realm has been looked up, and its answer waits for the main thread.
  void lookUpRealm() {
    serverTakes({"basic", "kerberos"});
    setRealm("EXAMPLE.ORG");
    load();
    panel().typeServer("studio");
    panel().finishServer();
    while (lookUps() == 0 && queues_->runNext()) {
    }
    ASSERT_EQ(lookUps(), 1U);
  }
};

TEST_F(LoginViewSlowRealmTest, answer_isDropped_whenTheServerWasEdited) {
  lookUpRealm();
  panel().typeServer("other");
  run();
  EXPECT_FALSE(areFieldsShown());
  EXPECT_EQ(controller_->loginSession(), nullptr);
  EXPECT_FALSE(log().contains("realm"));
}

TEST_F(LoginViewSlowRealmTest, answer_isDropped_whenAnotherActionRuns) {
  lookUpRealm();
  connect();
  run();
  EXPECT_EQ(target_->actions.size(), 1U);
  EXPECT_FALSE(log().contains("automatically"));
}

TEST_F(LoginViewSlowRealmTest, answer_isDropped_whenTheLoginWasCancelled) {
  lookUpRealm();
  controller_->setCurrentLoginAction(nullptr);
  run();
  EXPECT_EQ(controller_->loginSession(), nullptr);
}

TEST_F(LoginViewSlowRealmTest, answer_isDropped_whenTheControllerDied) {
  lookUpRealm();
  controller_.reset();
  run();
  EXPECT_THAT(tools().commands(), ElementsAre("listinfo"));
}

} // namespace
