#include "ServerActionTest.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRToolActionFactory.h>

#include <gmock/gmock.h>

using lumora::tests::pair;
using lumora::tests::passwordSession;
using testing::ElementsAre;

namespace {

class FactoryTest : public lumora::tests::ServerActionTest {};

TEST_F(FactoryTest, info_asksPort8170AndSendsNoCredentials_whenThePortIsZero) {
  const auto action = LMRActionFactory::actionToGetInfoForServer_port("lumora.example.org", 0);
  EXPECT_EQ(action->session(), nullptr);
  EXPECT_THAT(requestOf(action), ElementsAre("listinfo", pair("server", "lumora.example.org:8170")));
}

TEST_F(FactoryTest, info_asksThePort_whenItIs8080) {
  const auto action = LMRActionFactory::actionToGetInfoForServer_port("lumora.example.org", 8080);
  EXPECT_THAT(requestOf(action), ElementsAre("listinfo", pair("server", "lumora.example.org:8080")));
}

TEST_F(FactoryTest, info_saysThatItConnects) {
  const auto action = LMRActionFactory::actionToGetInfoForServer_port("lumora.example.org", 0);
  EXPECT_EQ(action->description(), "Connecting…");
  EXPECT_TRUE(action->expectXMLResponse());
}

TEST_F(FactoryTest, listWorkflows_sendsTheCommandAlone) {
  const auto session = passwordSession();
  const auto action = LMRActionFactory::actionToListWorkflowsWithSession(session);
  EXPECT_EQ(action->session(), session);
  EXPECT_EQ(action->command(), "listworkflows");
  EXPECT_EQ(action->arguments(), std::nullopt);
  EXPECT_EQ(action->description(), "Getting workflows…");
  EXPECT_TRUE(action->expectXMLResponse());
}

TEST_F(FactoryTest, start_hasExactlyTwoArguments_whenItIsNotOfSoundAlone) {
  const auto action =
      LMRActionFactory::actionToStartRemoteCamera_afterDelay_audioOnly_session("Studio A", 5, false, nullptr);
  EXPECT_EQ(action->command(), std::nullopt);
  EXPECT_THAT(*action->arguments(), ElementsAre(pair("start", "Studio A"), pair("delay", 5)));
}

TEST_F(FactoryTest, start_endsWithABareWord_whenItIsOfSoundAlone) {
  const auto action =
      LMRActionFactory::actionToStartRemoteCamera_afterDelay_audioOnly_session("Studio A", 5, true, nullptr);
  EXPECT_THAT(*action->arguments(), ElementsAre(pair("start", "Studio A"), pair("delay", 5), "audio_only"));
}

TEST_F(FactoryTest, install_sendsPathAndOverwrite_whenThereIsNoPassword) {
  const auto action = LMRActionFactory::actionToInstallWorkflowFromPath_withMasterPassword_overwrite_withSession(
      "/tmp/w", std::nullopt, true, nullptr);
  EXPECT_THAT(*action->arguments(), ElementsAre(pair("path", "/tmp/w"), "overwrite"));
}

TEST_F(FactoryTest, setConfiguration_sendsOneBareWord) {
  const lumora::Authorization authorization{};
  const auto action = LMRActionFactory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization(
      "a=b %@", std::string(LMRRemoteRecorderQualityDeviceKey), &authorization);
  EXPECT_THAT(*action->arguments(), ElementsAre("Capture=a=b %@"));
  EXPECT_EQ(action->session(), nullptr);
  EXPECT_EQ(action->authorizationRef(), &authorization);
}

TEST_F(FactoryTest, submitWorkflow_hasFiveArguments_whenThereAreTwoInputsAndNoPassword) {
  const auto action =
      LMRToolActionFactory::actionToSubmitWorkflow_withMasterPassword_metadataPath_andInputs_withSession(
          "Lectures", std::nullopt, "/tmp/m.plist", {"/tmp/a", "/tmp/b"}, passwordSession());
  EXPECT_THAT(*action->arguments(),
              ElementsAre(pair("workflow", "Lectures"), pair("metadata", "/tmp/m.plist"), pair("basedir", "/tmp"),
                          pair("input", "/tmp/a"), pair("input", "/tmp/b")));
}

TEST_F(FactoryTest, pairEndsAtItsKey_whenAWordIsAbsent) {
  using Factory = LMRActionFactory;
  EXPECT_THAT(*Factory::actionToGetStatusForRemoteCamera_session(std::nullopt, nullptr)->arguments(),
              ElementsAre(pair("status")));
  EXPECT_THAT(
      *Factory::actionToStartRemoteCamera_afterDelay_audioOnly_session(std::nullopt, 0, false, nullptr)->arguments(),
      ElementsAre(pair("start"), pair("delay", 0)));
  EXPECT_THAT(*Factory::actionToDeleteWorkflowWithUUID_withSession(std::nullopt, nullptr)->arguments(),
              ElementsAre(pair("workflow_uuid")));
  EXPECT_THAT(*Factory::actionToDownloadWorkflowWithUUID_toPath_withSession("W-1", std::nullopt, nullptr)->arguments(),
              ElementsAre(pair("workflow_uuid", "W-1"), pair("path")));
}

TEST_F(FactoryTest, bind_sendsNoWord_whenTheNameIsAbsent) {
  const lumora::Authorization authorization{};
  const auto action =
      LMRActionFactory::actionToBindCamera_session_authorization(std::nullopt, passwordSession(), &authorization);
  EXPECT_EQ(action->arguments(), lumora::Array());
}

TEST_F(FactoryTest, toolAction_isRefusedWithAWarning_whenThereIsNoSession) {
  platform_.application->setIdentifier("org.example.recorder");
  EXPECT_EQ(LMRToolAction::actionWithCommand_arguments("workflow", std::nullopt), nullptr);
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("WARNING: org.example.recorder tried to create a LMRToolAction without a server session"));
}

} // namespace
