#include "HelperAgentTest.h"

using lumora::HelperAgentError;

namespace {

class AuthorizationTest : public lumora::tests::HelperAgentTest {};

TEST_F(AuthorizationTest, isNeeded) {
  const auto [reply, error] = perform(agents_, "echo", {}, nullptr);
  EXPECT_EQ(reply, std::nullopt);
  EXPECT_EQ(error->code(), static_cast<int>(HelperAgentError::NotAuthorized));
  EXPECT_EQ(error->localizedDescription(), "org.vantor.lumagentconfigd does not allow this: not your authorization");
}

TEST_F(AuthorizationTest, isOfNoUseToAnotherConnection) {
  const auto stolen = authorize(agents_);
  ASSERT_TRUE(stolen);
  lumora::backend::DBusHelperAgent thief;
  EXPECT_EQ(perform(thief, "echo", {}, &*stolen).error->code(), static_cast<int>(HelperAgentError::NotAuthorized));
  EXPECT_TRUE(perform(agents_, "echo", {}, &*stolen).reply);
}

} // namespace
