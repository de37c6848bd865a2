// A login against a server that answers with anything.
#include "FieldValues.h"

#include <LumoraKit/login/LMRAuthenticationAction.h>
#include <LumoraKit/testing/FakePlatform.h>

using lumora::Dictionary;
using lumora::fakes::ToolReply;
using lumora::tests::FieldValue;

namespace {

using OptionalText = std::optional<std::string>;

class LoginReplyTest : public testing::TestWithParam<FieldValue> {
protected:
  /// Logs in by single sign-on, so that the user's name is taken from the reply as well.
  std::shared_ptr<LMRSession> sessionAfter(const Dictionary& information, const Dictionary& workflows) {
    platform_.toolRunner->reply("listinfo", ToolReply::success(information));
    platform_.toolRunner->reply("listworkflows", ToolReply::success(workflows));
    const auto action = LMRAuthenticationAction::actionWithServer_port("lumora.example.org", 0);
    action->runSynchronously();
    EXPECT_EQ(action->error(), nullptr);
    return action->session();
  }

  /// What is kept of the field: a text as it is, of everything else nothing.
  OptionalText kept() const {
    const lumora::Value value = GetParam().make();
    const std::string* const text = value.string();
    return text ? OptionalText(*text) : std::nullopt;
  }

  lumora::fakes::FakePlatform platform_;
};

// Texts are compared without printing them: one has eight million characters.

TEST_P(LoginReplyTest, versionIsKept_whenItIsAText) {
  const auto session = sessionAfter({{"server_version", GetParam().make()}}, {});
  ASSERT_TRUE(session);
  EXPECT_TRUE(session->version() == kept());
}

TEST_P(LoginReplyTest, namesAreKept_whenTheyAreTexts) {
  const auto session = sessionAfter({}, {{"user_shortname", GetParam().make()}, {"user_fullname", GetParam().make()}});
  ASSERT_TRUE(session);
  EXPECT_TRUE(session->userName() == kept());
  EXPECT_TRUE(session->userFullName() == kept());
}

TEST_P(LoginReplyTest, serverIsNoLibrary_whateverElseItSays) {
  const auto session = sessionAfter({}, {{"server", GetParam().make()}});
  ASSERT_TRUE(session);
  EXPECT_FALSE(session->isLumoraLibraryServer());
}

TEST_P(LoginReplyTest, fieldsThatNobodyReadsAreOfNoConsequence) {
  const auto session = sessionAfter({{"http_auth_type", GetParam().make()}},
                                    {{"workflows", GetParam().make()}, {"", GetParam().make()}});
  EXPECT_TRUE(session);
}

INSTANTIATE_TEST_SUITE_P(All, LoginReplyTest, testing::ValuesIn(lumora::tests::fieldValues()), lumora::tests::nameOf);

TEST(EmptyLoginReplyTest, leavesTheSessionWithoutNamesAndVersion) {
  const lumora::fakes::FakePlatform platform;
  const auto action = LMRAuthenticationAction::actionWithServer_port("lumora.example.org", 0);
  action->runSynchronously();
  const auto session = action->session();
  ASSERT_TRUE(session);
  EXPECT_EQ(session->version(), std::nullopt);
  EXPECT_EQ(session->userName(), std::nullopt);
  EXPECT_EQ(session->userFullName(), std::nullopt);
  EXPECT_FALSE(session->isLumoraLibraryServer());
}

} // namespace
