#include "ClientTest.h"
#include "support/TestKDC.h"

#include <LumoraKit/actions/LMRToolPaths.h>

using lumora::Array;
using lumora::tests::FailedWith;
using lumora::tests::pair;
using lumora::tests::TestKDC;
using testing::HasSubstr;

namespace {

class InformationTest : public lumora::tests::ClientTest {};

TEST_F(InformationTest, info_tellsWhatTheServerIs) {
  EXPECT_EQ(output({"info"}), "Host            localhost\n"
                              "Kind            LumoraServer\n"
                              "Version         2.0.1\n"
                              "Authentication  basic, digest\n"
                              "SSL             yes\n");
  EXPECT_EQ(request(), (Array{"listinfo", pair("server", "localhost:8170")}));
}

TEST_F(InformationTest, info_printsTheWholeReplyAsJSON) {
  EXPECT_EQ(output({"info", "-o", "json"}), R"({
  "http_auth_type": [
    "basic",
    "digest"
  ],
  "server_version": "2.0.1",
  "server": "LumoraServer",
  "hostname": "localhost",
  "ssl": true
}
)");
}

TEST_F(InformationTest, info_takesTheServersAddress) {
  EXPECT_THAT(run({"info", "--server", "localhost:81"}), FailedWith(20, "Server is unavailable: "));
  EXPECT_THAT(run({"info", "--server=localhost", "--port=82"}), FailedWith(20, "no server listens on port 82"));
  EXPECT_THAT(run({"info", "-s", "elsewhere"}), FailedWith(21, "No server at hostname: "));
  EXPECT_THAT(run({"info", "-s", "localhost:x"}), FailedWith(64, "not a server's address"));
  EXPECT_THAT(run({"info", "--port", "0"}), FailedWith(64, "not a port"));
  EXPECT_THAT(run({"info", "--port", "65536"}), FailedWith(64, "not a port"));
  ::unsetenv("LUMORA_SERVER");
  EXPECT_THAT(run({"info"}), FailedWith(64, "A server is needed"));
}

TEST_F(InformationTest, login_tellsWhoOneIs) {
  EXPECT_EQ(output({"login"}), "User            ada\n"
                               "Name            Ada Lovelace\n"
                               "Server          localhost\n"
                               "Port            8170\n"
                               "Version         2.0.1\n"
                               "Logged in by    password\n"
                               "Library server  no\n");
  EXPECT_EQ(requests(), (std::vector<Array>{{"listinfo", pair("server", "localhost:8170")}, {"listworkflows"}}));
}

TEST_F(InformationTest, login_fails_whenThePasswordIsWrong) {
  EXPECT_THAT(run({"login", "--password-file", file("wrong", "pear\n")}), FailedWith(26, "Not authorized"));
  EXPECT_THAT(run({"login", "--user", "bob"}), FailedWith(26, "Not authorized"));
}

TEST_F(InformationTest, errorsAreInTheUsersLanguage) {
  ::setenv("LC_ALL", "de_DE.UTF-8", 1);
  const auto refused = run({"login", "--user", "bob"});
  EXPECT_EQ(refused.status, 26);
  EXPECT_THAT(refused.standardError, testing::Not(HasSubstr("Not authorized")));
}

TEST_F(InformationTest, toolIsMissing_whenTheRootHasNone) {
  EXPECT_THAT(run({"info", "--root", folder_.path().string()}), FailedWith(127, "No such file or directory"));
}

/// With a Kerberos server, and a ticket for whoever asks.
class SingleSignOnTest : public lumora::tests::ClientTest {
protected:
  void SetUp() override {
    if (const auto obstacle = TestKDC::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(kerberos_.start());
    kerberos_.addUser("ada", "tickets");
    const auto keytab = kerberos_.addService("lumora/localhost").string();
    ASSERT_EQ(server_.administrate({"single-sign-on", "enable"}, {"--keytab", keytab}).status, 0);
    const auto principal = std::string("ada@") + TestKDC::realm;
    ASSERT_EQ(server_.administrate({"single-sign-on", "map"}, {principal, "ada"}).status, 0);
  }
  static lumora::tests::ProgramRun runPlainly(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), LUMORA_CLIENT_PROGRAM);
    return lumora::tests::runToEnd(arguments);
  }

  TestKDC kerberos_;
};

TEST_F(SingleSignOnTest, ticketLogsIn_whenKerberosIsAskedFor) {
  EXPECT_THAT(runPlainly({"login", "--kerberos"}), FailedWith(26, "Not authorized"));
  ASSERT_TRUE(kerberos_.logIn("ada", "tickets"));
  const auto login = runPlainly({"login", "--kerberos"});
  EXPECT_EQ(login.status, 0) << login.standardError;
  EXPECT_THAT(login.standardOutput, testing::StartsWith("User            ada\n"));
  EXPECT_THAT(login.standardOutput, HasSubstr("Logged in by    kerberos\n"));
  EXPECT_EQ(runPlainly({"workflows", "--kerberos"}).status, 0);
}

TEST_F(SingleSignOnTest, passwordIsRefused_whenKerberosIsAskedFor) {
  EXPECT_THAT(run({"workflows", "--kerberos"}), FailedWith(64, "leave out"));
  EXPECT_THAT(runPlainly({"bind", "Studio A", "--kerberos"}), FailedWith(64, "needs a login by password"));
}

} // namespace
