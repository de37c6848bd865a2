#include "KerberosTest.h"
#include "support/MainLoop.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <gmock/gmock.h>

#include <cstdlib>
#include <thread>

#include <netinet/in.h>
#include <sys/socket.h>

using lumora::Array;
using lumora::tests::ProgramRun;
using lumora::tests::SandboxServer;
using lumora::tests::TestKDC;
using testing::HasSubstr;

namespace {

/// A server on a port of its own that takes connections and never answers.
class SilentServer {
public:
  SilentServer() : socket_(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
    address_.sin_family = AF_INET;
    address_.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t length = sizeof(address_);
    EXPECT_EQ(::bind(socket_.get(), reinterpret_cast<const sockaddr*>(&address_), length), 0);
    EXPECT_EQ(::listen(socket_.get(), 8), 0);
    EXPECT_EQ(::getsockname(socket_.get(), reinterpret_cast<sockaddr*>(&address_), &length), 0);
  }
  std::uint16_t port() const { return ntohs(address_.sin_port); }

private:
  lumora::backend::FileDescriptor socket_;
  sockaddr_in address_{};
};

class TicketTest : public lumora::tests::KerberosTest {
protected:
  ProgramRun listWorkflows() const {
    return server_.request({Array{"server", "localhost:8170"}, Array{"auth", "Kerberos"}, "listworkflows"});
  }
  void expectRefusal(int status, const std::string& reason) const {
    const auto run = listWorkflows();
    EXPECT_EQ(run.status, status);
    EXPECT_THAT(run.standardError, HasSubstr(reason));
    EXPECT_EQ(run.standardOutput, "");
  }
  std::string userOfSession() const {
    const auto reply = lumora::dictionaryWithXMLDescription(listWorkflows().standardOutput);
    return reply ? reply->string("user_shortname").value_or("") : "";
  }
};

TEST_F(TicketTest, isTheUserOfItsPrincipal) {
  ASSERT_TRUE(logIn("ada"));
  EXPECT_EQ(userOfSession(), "ada");
}

TEST_F(TicketTest, isOfferedAsAWayToLogIn) {
  const auto info = server_.request({"listinfo", Array{"server", "localhost:8170"}});
  EXPECT_THAT(info.standardOutput, HasSubstr("<string>kerberos</string>"));
}

TEST_F(TicketTest, isGoodForTheAuxiliaryTool) {
  ASSERT_TRUE(logIn("ada"));
  const auto run = server_.request({Array{"server", "localhost:8170"}, Array{"subcommand", "workflow"}}, "lumaction");
  EXPECT_EQ(run.status, 12) << run.standardError;
  kerberos_.logOut();
  const auto metadata = server_.folder() / "metadata.plist";
  lumora::tests::writeFile(metadata, "<plist version=\"1.0\"><dict/></plist>");
  const auto refused = server_.request({Array{"server", "localhost:8170"}, Array{"subcommand", "workflow"},
                                        Array{"workflow", "single-video"}, Array{"metadata", metadata.string()},
                                        Array{"basedir", "/tmp"}, Array{"input", metadata.string()}},
                                       "lumaction");
  EXPECT_EQ(refused.status, 26) << refused.standardError;
}

TEST_F(TicketTest, isStatus26_whenThereIsNone) {
  expectRefusal(26, "lumctl: there is no Kerberos ticket: ");
}

TEST_F(TicketTest, isStatus26_whenItWasGivenBack) {
  ASSERT_TRUE(logIn("ada"));
  EXPECT_EQ(userOfSession(), "ada");
  kerberos_.logOut();
  expectRefusal(26, "there is no Kerberos ticket");
}

TEST_F(TicketTest, isStatus26_whenItHasExpired) {
  ASSERT_TRUE(logIn("ada", {"-l", "1s"}));
  const auto limit = std::chrono::steady_clock::now() + lumora::tests::generousLimit;
  while (listWorkflows().status == 0 && std::chrono::steady_clock::now() < limit) {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
  }
  expectRefusal(26, "xpired");
}

TEST_F(TicketTest, isStatus26_whenItIsForAnotherService) {
  kerberos_.addService("mail/localhost");
  ASSERT_TRUE(logIn("ada", {"-S", "mail/localhost"}));
  expectRefusal(26, "ada@LUMORA.TEST gets no ticket for lumora/localhost@LUMORA.TEST: ");
}

TEST_F(TicketTest, isStatus26_whenItIsOfAnotherRealm) {
  TestKDC other("OTHER.TEST");
  ASSERT_TRUE(other.start());
  other.addUser("ada", "tickets");
  ASSERT_TRUE(other.logIn("ada", "tickets"));
  expectRefusal(26, "ada@OTHER.TEST gets no ticket for lumora/localhost@LUMORA.TEST: ");
}

TEST_F(TicketTest, isStatus26_whenThePrincipalIsNobodys) {
  ASSERT_TRUE(logIn("bob"));
  expectRefusal(26, "the principal bob@LUMORA.TEST is no user of this server");
  ASSERT_EQ(server_.administrate({"single-sign-on", "unmap"}, {principal("ada")}).status, 0);
  ASSERT_TRUE(logIn("ada"));
  expectRefusal(26, "the principal ada@LUMORA.TEST is no user of this server");
}

TEST_F(TicketTest, isStatus26_whenTheUserWasRemoved) {
  ASSERT_TRUE(logIn("ada"));
  ASSERT_EQ(server_.administrate({"user", "remove"}, {"ada"}).status, 0);
  expectRefusal(26, "is no user of this server");
}

TEST_F(TicketTest, isStatus26_whenTheServersKeyIsAnother) {
  ASSERT_TRUE(logIn("ada"));
  ASSERT_EQ(userOfSession(), "ada");
  std::filesystem::remove(keytab_);
  kerberos_.addService(service);
  ASSERT_EQ(server_.administrate({"single-sign-on", "enable"}, {"--keytab", keytab_.string()}).status, 0);
  expectRefusal(26, "the server does not take the ticket");
  kerberos_.logOut();
  ASSERT_TRUE(logIn("ada"));
  EXPECT_EQ(userOfSession(), "ada");
}

TEST_F(TicketTest, isStatus25_whenTheServersKeyIsGone) {
  ASSERT_TRUE(logIn("ada"));
  std::filesystem::remove(server_.root() / "var/lib/lumora/krb5.keytab");
  expectRefusal(25, "the server's keytab cannot be read");
}

TEST_F(TicketTest, isStatus26_whenThereIsNoConfigurationAndNoTicket) {
  ::setenv("KRB5_CONFIG", "/nonexistent/krb5.conf", 1);
  expectRefusal(26, "there is no Kerberos ticket");
}

TEST_F(TicketTest, isStatus22_whenTheConfigurationIsGone) {
  ASSERT_TRUE(logIn("ada"));
  ::setenv("KRB5_CONFIG", "/nonexistent/krb5.conf", 1);
  expectRefusal(22, "");
}

TEST_F(TicketTest, isStatus26_whenTheConfigurationIsBroken) {
  const auto broken = server_.folder() / "krb5.conf";
  lumora::tests::writeFile(broken, "[libdefaults\n{{{");
  ::setenv("KRB5_CONFIG", broken.c_str(), 1);
  expectRefusal(26, "the Kerberos configuration cannot be read: ");
}

TEST_F(TicketTest, isStatus22_whenTheKerberosServerIsAbsent) {
  ASSERT_TRUE(logIn("ada"));
  kerberos_.stop();
  expectRefusal(22, "ada@LUMORA.TEST gets no ticket for lumora/localhost@LUMORA.TEST: ");
}

TEST_F(TicketTest, isStatus22_whenTheKerberosServerNeverAnswers) {
  ASSERT_TRUE(logIn("ada"));
  const SilentServer silent;
  kerberos_.pointClientsAt(silent.port());
  expectRefusal(22, "no Kerberos server answered within 5 seconds");
}

TEST_F(TicketTest, isGoodWithoutTheKerberosServer_whenItIsThereAlready) {
  ASSERT_TRUE(logIn("ada"));
  ASSERT_EQ(userOfSession(), "ada");
  kerberos_.stop();
  EXPECT_EQ(userOfSession(), "ada");
}

TEST_F(TicketTest, isStatus26_whenSingleSignOnWasDisabled) {
  ASSERT_TRUE(logIn("ada"));
  ASSERT_EQ(server_.administrate({"single-sign-on", "disable"}).status, 0);
  expectRefusal(26, "the server offers no single sign-on");
}

TEST_F(TicketTest, isNotCheckedAndNotNeeded_whenThePasswordIsGiven) {
  kerberos_.stop();
  auto request = server_.login();
  request.emplace_back("listworkflows");
  EXPECT_EQ(server_.request(request).status, 0);
}

TEST_F(TicketTest, needsAKeytabWithTheServicesKey) {
  const auto other = kerberos_.addService("mail/localhost");
  for (const auto& [keytab, reason] : {std::pair(other.string(), "no key of a service lumora/HOST"),
                                       std::pair(std::string("/nonexistent/keytab"), "/nonexistent/keytab")}) {
    const auto run = server_.administrate({"single-sign-on", "enable"}, {"--keytab", keytab});
    EXPECT_EQ(run.status, 1);
    EXPECT_THAT(run.standardError, HasSubstr(reason));
  }
  ASSERT_TRUE(logIn("ada"));
  EXPECT_EQ(userOfSession(), "ada");
}

TEST_F(TicketTest, mapsOnlyWholePrincipalsToUsersThatThereAre) {
  EXPECT_EQ(server_.administrate({"single-sign-on", "map"}, {"bob", "ada"}).status, 1);
  EXPECT_EQ(server_.administrate({"single-sign-on", "map"}, {principal("bob"), "nobody"}).status, 1);
  EXPECT_EQ(server_.administrate({"single-sign-on", "list"}).standardOutput, "ada@LUMORA.TEST\tada\n");
}

} // namespace
