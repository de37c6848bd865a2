#include "KerberosTest.h"
#include "support/MainLoop.h"
#include "support/ServerPanel.h"

#include <gmock/gmock.h>

using lumora::tests::SandboxServer;
using lumora::tests::serveUntil;
using testing::HasSubstr;

namespace {

/// The login panel of a user who types the server's name.
class PanelTest : public lumora::tests::KerberosTest {
protected:
  void SetUp() override {
    KerberosTest::SetUp();
    if (!IsSkipped()) {
      panel_ = std::make_unique<lumora::tests::ServerPanel>(server_);
    }
  }

  void typeServer() {
    panel_->user().typeServer(SandboxServer::host);
    panel_->user().finishServer();
  }
  bool isLoggedIn() { return panel_->controller().loginSession() != nullptr; }
  bool areFieldsShown() { return !panel_->controller().passwordControlsHidden(); }

  std::unique_ptr<lumora::tests::ServerPanel> panel_;
};

TEST_F(PanelTest, signsOnByItself_whenTheUserHoldsATicket) {
  ASSERT_TRUE(logIn("ada"));
  typeServer();
  ASSERT_TRUE(serveUntil([this] { return isLoggedIn(); })) << panel_->log();
  const auto session = panel_->controller().loginSession();
  EXPECT_EQ(session->authenticationType(), LMRAuthenticationTypeSingleSignOn);
  EXPECT_EQ(session->userName(), "ada");
  EXPECT_EQ(session->userFullName(), SandboxServer::userFullName);
  EXPECT_THAT(panel_->log(), HasSubstr("Default kerberos realm name is LUMORA.TEST, attempting Single Sign-On\n"));
  EXPECT_THAT(panel_->log(), HasSubstr("Successfully authenticated to 'localhost:8170' via Single Sign-On\n"));
  EXPECT_FALSE(areFieldsShown());
}

TEST_F(PanelTest, asksForThePassword_whenTheUserHoldsNoTicket) {
  typeServer();
  ASSERT_TRUE(serveUntil([this] { return areFieldsShown(); })) << panel_->log();
  EXPECT_THAT(panel_->log(), HasSubstr("Failed to automatically authenticate to 'localhost'\n"));
  panel_->user().typeUserName(SandboxServer::userName);
  panel_->user().typePassword(SandboxServer::password);
  panel_->connect();
  ASSERT_TRUE(serveUntil([this] { return isLoggedIn(); })) << panel_->log();
  EXPECT_EQ(panel_->controller().loginSession()->authenticationType(), LMRAuthenticationTypePassword);
  EXPECT_EQ(panel_->target().actions.size(), 1U);
}

TEST_F(PanelTest, triesNoTicket_whenTheMachineIsInNoRealm) {
  ASSERT_TRUE(logIn("ada"));
  kerberos_.forgetRealm();
  typeServer();
  ASSERT_TRUE(serveUntil([this] { return areFieldsShown(); })) << panel_->log();
  EXPECT_THAT(panel_->log(), HasSubstr("Could not get default kerberos realm name (error -1765328160), "
                                       "not attempting Single Sign-On\n"));
  EXPECT_FALSE(isLoggedIn());
}

} // namespace
