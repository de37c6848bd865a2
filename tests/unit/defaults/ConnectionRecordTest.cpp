#include <LumoraKit/login/LMRConnectionRecord.h>
#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

using LMRConnectionRecord::recordWithSession_port;
using LMRConnectionRecord::rememberRecentConnection;
using lumora::Dictionary;

namespace {

class ConnectionRecordTest : public testing::Test {
protected:
  ConnectionRecordTest() {
    session_->setServer("lumora.example.org");
    session_->setUserName("alice");
    session_->setPassword("open sesame");
    session_->setAuthenticationType(LMRAuthenticationTypePassword);
  }

  Dictionary recentConnections() const {
    const Dictionary domain = platform_.preferences->domain("org.vantor.lumora.kit");
    const Dictionary* const connections = domain.dictionary("RecentConnections");
    return connections ? *connections : Dictionary();
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<LMRSession> session_ = LMRSession::session();
};

TEST_F(ConnectionRecordTest, keys_areTheStoredOnes) {
  EXPECT_EQ(LMRSavedConnectionKey, "LMRSavedConnection");
  EXPECT_EQ(LMRRecentConnectionsKey, "RecentConnections");
  EXPECT_EQ(lumora::SavePasswordInKeychainKey, "SavePasswordInKeychain");
  EXPECT_EQ(LMRRecorderDestinationFolder, "RecorderDestinationFolder");
}

TEST_F(ConnectionRecordTest, record_holdsServerTypePortAndUserName) {
  EXPECT_EQ(recordWithSession_port(*session_, 8443),
            (Dictionary{{"server", "lumora.example.org"}, {"type", 1}, {"port", 8443}, {"userName", "alice"}}));
}

TEST_F(ConnectionRecordTest, record_holdsThePortAsEntered_whenItIsZero) {
  const Dictionary record = recordWithSession_port(*session_, 0);
  EXPECT_EQ(*record.find("port"), 0);
}

TEST_F(ConnectionRecordTest, record_endsBeforeTheUserName_whenTheSessionHasNone) {
  session_->setUserName(std::nullopt);
  EXPECT_EQ(recordWithSession_port(*session_, 0),
            (Dictionary{{"server", "lumora.example.org"}, {"type", 1}, {"port", 0}}));
}

TEST_F(ConnectionRecordTest, record_isEmpty_whenTheSessionHasNoServer) {
  session_->setServer(std::nullopt);
  EXPECT_TRUE(recordWithSession_port(*session_, 0).empty());
}

TEST_F(ConnectionRecordTest, remembering_replacesTheServersRecordAndLeavesTheOthers) {
  rememberRecentConnection(Dictionary{{"server", "one.example.org"}, {"userName", "alice"}});
  rememberRecentConnection(Dictionary{{"server", "two.example.org"}, {"userName", "bob"}});
  platform_.application->setIdentifier("org.example.second-application");
  rememberRecentConnection(Dictionary{{"server", "one.example.org"}, {"userName", "carol"}});
  EXPECT_EQ(recentConnections(),
            (Dictionary{{"one.example.org", Dictionary{{"server", "one.example.org"}, {"userName", "carol"}}},
                        {"two.example.org", Dictionary{{"server", "two.example.org"}, {"userName", "bob"}}}}));
}

TEST_F(ConnectionRecordTest, remembering_beginsAnew_whenWhatIsStoredIsNoDictionary) {
  platform_.preferences->setValue("org.vantor.lumora.kit", "RecentConnections", lumora::Value("nonsense"));
  const Dictionary record = recordWithSession_port(*session_, 0);
  rememberRecentConnection(record);
  EXPECT_EQ(recentConnections(), (Dictionary{{"lumora.example.org", record}}));
}

TEST_F(ConnectionRecordTest, remembering_storesNothing_whenTheRecordHasNoServer) {
  rememberRecentConnection(Dictionary());
  EXPECT_TRUE(platform_.preferences->domain("org.vantor.lumora.kit").empty());
}

TEST_F(ConnectionRecordTest, remembering_storesNoPassword) {
  rememberRecentConnection(recordWithSession_port(*session_, 0));
  EXPECT_EQ(lumora::Value(recentConnections()).description().find("open sesame"), std::string::npos);
}

} // namespace
