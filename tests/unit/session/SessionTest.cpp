#include <LumoraKit/actions/LMRSession.h>

#include <gtest/gtest.h>

#include <thread>

namespace {

std::shared_ptr<LMRSession> filledSession() {
  auto session = LMRSession::session();
  session->setServer("lumora.example.org");
  session->setVersion("2.1");
  session->setPort(8443);
  session->setUserName("alice");
  session->setUserFullName("Alice Example");
  session->setPassword("open sesame");
  session->setAuthenticationType(LMRAuthenticationTypePassword);
  session->setRequiresValidCertificate(true);
  session->setIsLumoraLibraryServer(true);
  return session;
}

class MarkedSession final : public LMRSession {
protected:
  std::shared_ptr<LMRSession> newSession() const override { return std::make_shared<MarkedSession>(); }
};

TEST(SessionTest, fresh_hasDefaultPortAndUnknownTypeAndNothingElse) {
  const auto session = LMRSession::session();
  EXPECT_EQ(session->port(), 8170);
  EXPECT_EQ(session->authenticationType(), 0);
  EXPECT_FALSE(session->server() || session->version() || session->userName() || session->userFullName() ||
               session->password());
  EXPECT_FALSE(session->requiresValidCertificate());
  EXPECT_FALSE(session->isLumoraLibraryServer());
}

TEST(SessionTest, description_isNullTextAndPort_whenFresh) {
  EXPECT_EQ(LMRSession::session()->description(), "(null):8170");
}

TEST(SessionTest, description_isServerAndPort) {
  EXPECT_EQ(filledSession()->description(), "lumora.example.org:8443");
}

TEST(SessionTest, copy_isNoLibraryServerAndOtherwiseEqual) {
  const auto session = filledSession();
  const auto copy = session->copyWithZone();
  EXPECT_FALSE(copy->isLumoraLibraryServer());
  EXPECT_TRUE(session->isLumoraLibraryServer());
  EXPECT_EQ(copy->server(), "lumora.example.org");
  EXPECT_EQ(copy->version(), "2.1");
  EXPECT_EQ(copy->port(), 8443);
  EXPECT_EQ(copy->userName(), "alice");
  EXPECT_EQ(copy->userFullName(), "Alice Example");
  EXPECT_EQ(copy->password(), "open sesame");
  EXPECT_EQ(copy->authenticationType(), LMRAuthenticationTypePassword);
  EXPECT_TRUE(copy->requiresValidCertificate());
}

TEST(SessionTest, copy_isIndependentOfItsOriginal) {
  const auto session = filledSession();
  const auto copy = session->copyWithZone();
  session->setServer("elsewhere.example.org");
  session->setPassword(std::nullopt);
  EXPECT_EQ(copy->server(), "lumora.example.org");
  EXPECT_EQ(copy->password(), "open sesame");
}

TEST(SessionTest, copy_isOfTheReceiversClass) {
  EXPECT_TRUE(std::dynamic_pointer_cast<MarkedSession>(MarkedSession().copyWithZone()));
}

TEST(SessionTest, server_isUnchanged_whenTheStringItWasSetFromChanges) {
  const auto session = LMRSession::session();
  std::string server = "lumora.example.org";
  session->setServer(server);
  server = "elsewhere.example.org";
  EXPECT_EQ(session->server(), "lumora.example.org");
}

TEST(SessionTest, port_isKeptAsZero_whenSetToZero) {
  const auto session = LMRSession::session();
  session->setPort(0);
  EXPECT_EQ(session->port(), 0);
  EXPECT_EQ(session->copyWithZone()->port(), 0);
}

TEST(SessionTest, strings_areNeverTorn_whenReadAndWrittenAtOnce) {
  const auto session = filledSession();
  const std::string shortName(10, 'a');
  const std::string longName(2000, 'b');
  session->setUserName(shortName);
  std::jthread writer([&](const std::stop_token& stop) {
    while (!stop.stop_requested()) {
      session->setUserName(longName);
      session->setUserName(shortName);
    }
  });
  for (int round = 0; round < 2000; ++round) {
    const auto name = session->userName();
    ASSERT_TRUE(name == shortName || name == longName);
  }
}

} // namespace
