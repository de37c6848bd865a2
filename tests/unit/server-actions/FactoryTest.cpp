#include "ServerActionTest.h"

#include <LumoraKit/actions/LMRActionFactory.h>

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

} // namespace
