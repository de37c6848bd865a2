#include "HelperAgentTest.h"

#include <gmock/gmock.h>

using lumora::HelperAgentError;
using lumora::tests::AgentBus;
using lumora::tests::ChildProgram;
using testing::StartsWith;

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

// Real callers of other users, judged by a real polkitd.
class PolkitTest : public testing::Test {
protected:
  static constexpr const char* allowedUser = "nobody";
  static constexpr const char* allowedNumber = "65534";
  static constexpr const char* refusedNumber = "1";
  static constexpr const char* rootNumber = "0";

  void SetUp() override {
    for (const auto& obstacle : {AgentBus::obstacle(), AgentBus::polkitObstacle()}) {
      if (obstacle) {
        GTEST_SKIP() << *obstacle;
      }
    }
    ASSERT_TRUE(bus_.start());
    ASSERT_TRUE(bus_.startPolkit(allowedUser));
    ASSERT_TRUE(bus_.startAgent({}));
  }

  static std::unique_ptr<ChildProgram> call(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), "--caller");
    return ChildProgram::startSelf(std::move(arguments));
  }

  const std::string notAuthorized_ = std::to_string(static_cast<int>(HelperAgentError::NotAuthorized));
  AgentBus bus_;
};

TEST_F(PolkitTest, unprivilegedCallerChangesTheConfiguration_whenAllowed) {
  const auto caller = call({allowedNumber});
  EXPECT_THAT(caller->readLine(), StartsWith("authorized "));
  caller->writeLine("go on");
  EXPECT_EQ(caller->readLine(), "succeeded Capture=high");
}

TEST_F(PolkitTest, unprivilegedCallerIsRefused_whenNotAllowed) {
  EXPECT_EQ(call({refusedNumber})->readLine(), "refused " + notAuthorized_);
}

TEST_F(PolkitTest, authorizationIsOfNoUse_whenStolen) {
  const auto owner = call({allowedNumber});
  const std::string line = owner->readLine();
  ASSERT_THAT(line, StartsWith("authorized "));
  for (const char* const thiefsNumber : {refusedNumber, allowedNumber, rootNumber}) {
    const auto thief = call({thiefsNumber, line.substr(line.find(' ') + 1)});
    EXPECT_EQ(thief->readLine(), line);
    thief->writeLine("go on");
    EXPECT_EQ(thief->readLine(), "failed " + notAuthorized_) << thiefsNumber;
  }
  owner->writeLine("go on");
  EXPECT_EQ(owner->readLine(), "succeeded Capture=high");
}

} // namespace
