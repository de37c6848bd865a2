#include "ServerActionTest.h"

#include <LumoraKit/actions/LMRActionFactory.h>

using lumora::tests::passwordSession;
using Factory = LMRActionFactory;

namespace {

class FactoryDeathTest : public testing::Test {
protected:
  FactoryDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }

  const lumora::Authorization authorization_{};
};

TEST_F(FactoryDeathTest, bindStopsTheProcess_whenThereIsNoSession) {
  EXPECT_DEATH(Factory::actionToBindCamera_session_authorization("Studio A", nullptr, nullptr),
               "session != nil, in actionToBindCamera_session_authorization of LMRActionFactory");
}

TEST_F(FactoryDeathTest, bindStopsTheProcess_whenThereIsNoAuthorization) {
  EXPECT_DEATH(Factory::actionToBindCamera_session_authorization("Studio A", passwordSession(), nullptr),
               "authorization != nil, in actionToBindCamera_session_authorization of LMRActionFactory");
}

TEST_F(FactoryDeathTest, unbindStopsTheProcess_whenThereIsNoSession) {
  EXPECT_DEATH(Factory::actionToUnbindCamera_session_authorization("Studio A", nullptr, &authorization_),
               "session != nil, in actionToUnbindCamera_session_authorization of LMRActionFactory");
}

TEST_F(FactoryDeathTest, unbindStopsTheProcess_whenThereIsNoAuthorization) {
  EXPECT_DEATH(Factory::actionToUnbindCamera_session_authorization("Studio A", passwordSession(), nullptr),
               "authorization != nil, in actionToUnbindCamera_session_authorization of LMRActionFactory");
}

TEST_F(FactoryDeathTest, setConfigurationStopsTheProcess_whenThereIsNoAuthorization) {
  EXPECT_DEATH(Factory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization("", "", nullptr),
               "authorization != nil, in actionToSetRemoteRecorderConfigurationValue_forKey_authorization of "
               "LMRActionFactory");
}

TEST_F(FactoryDeathTest, setConfigurationStopsTheProcess_whenTheKeyIsEmptyOrAbsent) {
  for (const auto& key : {std::optional<std::string>(""), std::optional<std::string>()}) {
    EXPECT_DEATH(Factory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization("", key, &authorization_),
                 "\\[key length\\] > 0, in actionToSetRemoteRecorderConfigurationValue_forKey_authorization");
  }
}

TEST_F(FactoryDeathTest, setConfigurationStopsTheProcess_whenTheValueIsEmptyOrAbsent) {
  for (const auto& value : {std::optional<std::string>(""), std::optional<std::string>()}) {
    EXPECT_DEATH(
        Factory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization(value, "Capture", &authorization_),
        "\\[value length\\] > 0, in actionToSetRemoteRecorderConfigurationValue_forKey_authorization");
  }
}

} // namespace
