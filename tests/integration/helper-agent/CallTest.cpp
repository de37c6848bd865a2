#include "HelperAgentTest.h"
#include "support/Sessions.h"
#include "support/ValuePrinter.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/testing/RecordingLog.h>

#include <gmock/gmock.h>

#include <array>
#include <thread>
#include <vector>

using lumora::Array;
using lumora::Dictionary;
using testing::ElementsAre;

namespace {

class CallTest : public lumora::tests::HelperAgentTest {};

TEST_F(CallTest, bringsTheReply) {
  const Dictionary request{{"subarguments", Array{"Capture=\"high\" & <low>", "講義 🎥\nÜbung"}},
                           {"pass", "open sesame"}};
  const auto [reply, error] = perform("echo", request);
  ASSERT_FALSE(error) << error->description();
  EXPECT_EQ(reply, request);
}

TEST_F(CallTest, bringsEachThreadItsOwnReply_whenManyCallAtOnce) {
  const auto authorization = authorize(agents_);
  std::array<std::optional<Dictionary>, 16> replies;
  {
    std::vector<std::jthread> threads;
    for (std::size_t index = 0; index < replies.size(); ++index) {
      threads.emplace_back([&, index] {
        replies.at(index) = perform(agents_, "echo", {{"index", std::uint64_t{index}}}, &*authorization).reply;
      });
    }
  }
  for (std::size_t index = 0; index < replies.size(); ++index) {
    EXPECT_EQ(replies.at(index), (Dictionary{{"index", std::uint64_t{index}}}));
  }
}

TEST_F(CallTest, shareOneConnection_whenTheFirstOnesComeAtOnce) {
  std::array<std::optional<Dictionary>, 16> replies;
  {
    std::vector<std::jthread> threads;
    for (auto& reply : replies) {
      threads.emplace_back([&] { reply = perform("echo").reply; });
    }
  }
  for (const auto& reply : replies) {
    EXPECT_EQ(reply, Dictionary());
  }
}

// The whole way, from an action to the agent's reply.
class ActionCallTest : public lumora::tests::HelperAgentTest {
protected:
  ActionCallTest() {
    auto platform = previous_;
    platform.log = log_;
    platform.helperAgent = std::make_shared<lumora::backend::DBusHelperAgent>();
    lumora::Platform::install(platform);
  }
  ~ActionCallTest() override { lumora::Platform::install(previous_); }

  lumora::Platform previous_ = lumora::Platform::current();
  std::shared_ptr<lumora::fakes::RecordingLog> log_ = std::make_shared<lumora::fakes::RecordingLog>();
};

TEST_F(ActionCallTest, actionSucceeds_whenTheAgentRanItsCommand) {
  const auto authorization = authorize(*lumora::Platform::current().helperAgent);
  ASSERT_TRUE(authorization);
  const auto action = LMRActionFactory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization(
      "high", "Capture", &*authorization);
  action->runSynchronously();
  ASSERT_FALSE(action->error()) << action->error()->description();
  EXPECT_EQ(*action->result(), (Dictionary{{"changed", "Capture=high"}}));
}

TEST_F(ActionCallTest, actionFailsWithTheCommandsStatus) {
  const auto authorization = authorize(*lumora::Platform::current().helperAgent);
  ASSERT_TRUE(authorization);
  const auto action = LMRActionFactory::actionToBindCamera_session_authorization(
      "Studio A", lumora::tests::passwordSession(), &*authorization);
  action->runSynchronously();
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->error()->code(), 35);
  EXPECT_EQ(action->error()->userInfo().string("stderr"), "the camera is taken");
  EXPECT_THAT(log_->lines(), ElementsAre("Error 35 for bind: the camera is taken"));
}

TEST_F(ActionCallTest, actionFailsAndNothingIsSent_whenNoPropertyListCarriesTheRequest) {
  const auto authorization = authorize(*lumora::Platform::current().helperAgent);
  ASSERT_TRUE(authorization);
  const auto action = LMRActionFactory::actionToBindCamera_session_authorization(
      "Studio \xff", lumora::tests::passwordSession(), &*authorization);
  action->runSynchronously();
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->error()->domain(), lumora::HelperAgentErrorDomain);
  EXPECT_EQ(action->error()->code(), static_cast<int>(lumora::HelperAgentError::RequestUnwritable));
  perform("echo");
  EXPECT_EQ(agent_->readLine(), "echo");
}

} // namespace
