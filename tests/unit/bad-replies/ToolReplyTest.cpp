// What the framework does not look into comes through to the caller as it is; names come through to the tool.
#include "FieldValues.h"
#include "support/Sessions.h"
#include "support/ToolArguments.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRToolActionFactory.h>
#include <LumoraKit/testing/FakePlatform.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::Value;
using lumora::fakes::ToolReply;
using lumora::tests::FieldValue;
using lumora::tests::pair;
using lumora::tests::passwordSession;
using Factory = LMRActionFactory;

namespace {

class ToolReplyTest : public testing::TestWithParam<FieldValue> {
protected:
  lumora::fakes::FakePlatform platform_;
};

TEST_P(ToolReplyTest, comesThroughAsItIs) {
  const Dictionary reply{{std::string(LMRSubmissionUUIDSKey), GetParam().make()}};
  platform_.toolRunner->setDefaultReply(ToolReply::success(reply));
  const auto action = Factory::actionToCreateRecordingContainerForWorkflowUUID_session("W-1", nullptr);
  action->runSynchronously();
  EXPECT_EQ(action->error(), nullptr);
  ASSERT_TRUE(action->result());
  EXPECT_TRUE(*action->result() == reply);
}

INSTANTIATE_TEST_SUITE_P(All, ToolReplyTest, testing::ValuesIn(lumora::tests::fieldValues()), lumora::tests::nameOf);

// Names that a user may give.

std::vector<FieldValue> writableNames() {
  return {{"quotes", R"(Studio "A" & 'B' <C>)"},
          {"newLines", "Studio\nA\r\n\tB"},
          {"emoji", "🎥 Studio 講義 👩‍🏫"},
          {"endOfSection", "]]> &amp; &#10;"},
          {"formats", "%@ %d %n %"},
          {"options", "--help"},
          {"empty", ""},
          {"mebibyte", std::string(std::size_t{1024} * 1024, '\'')}};
}

class NameTest : public testing::TestWithParam<FieldValue> {
protected:
  std::string name() const {
    const Value value = GetParam().make();
    return *value.string();
  }
  lumora::fakes::FakePlatform platform_;
};

class WritableNameTest : public NameTest {};

TEST_P(WritableNameTest, reachesTheToolUnchanged) {
  Factory::actionToGetStatusForRemoteCamera_session(name(), nullptr)->runSynchronously();
  const auto requests = platform_.toolRunner->requests();
  ASSERT_EQ(requests.size(), 1U);
  ASSERT_EQ(requests[0].elements.size(), 1U);
  EXPECT_TRUE(requests[0].elements[0] == pair("status", name()));
}

TEST_P(WritableNameTest, reachesTheAuxiliaryToolUnchanged) {
  LMRToolActionFactory::actionToSubmitWorkflow_withMasterPassword_metadataPath_andInputs_withSession(
      name(), name(), name(), {name()}, passwordSession())
      ->runSynchronously();
  const auto requests = platform_.toolRunner->requests();
  ASSERT_EQ(requests.size(), 1U);
  EXPECT_TRUE(requests[0].value("workflow") == name());
  EXPECT_TRUE(requests[0].value("master_password") == name());
  EXPECT_TRUE(requests[0].value("input") == name());
}

TEST_P(WritableNameTest, reachesTheHelperAgentUnchanged) {
  const lumora::Authorization authorization{};
  Factory::actionToBindCamera_session_authorization(name(), passwordSession(), &authorization)->runSynchronously();
  ASSERT_EQ(platform_.helperAgent->callCount(), 1U);
  EXPECT_TRUE(*platform_.helperAgent->calls()[0].request.array("subarguments") == Array{name()});
}

INSTANTIATE_TEST_SUITE_P(All, WritableNameTest, testing::ValuesIn(writableNames()), lumora::tests::nameOf);

std::vector<FieldValue> unwritableNames() {
  return {{"invalidUTF8", "Studio \xff"},       {"halfACharacter", "Studio \xe2\x82"}, {"overlong", "Studio \xc0\xaf"},
          {"surrogate", "Studio \xed\xa0\x80"}, {"zero", std::string("Studio\0A", 8)}, {"bell", "Studio \a"}};
}

class UnwritableNameTest : public NameTest {};

TEST_P(UnwritableNameTest, isRefusedBeforeTheToolIsRun) {
  const auto action = Factory::actionToStartRemoteCamera_afterDelay_audioOnly_session(name(), 5, true, nullptr);
  action->runSynchronously();
  EXPECT_EQ(platform_.toolRunner->requestCount(), 0U);
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->error()->domain(), LMRErrorDomain);
  EXPECT_EQ(action->error()->code(), 11);
  EXPECT_EQ(action->error()->localizedDescription(), "Invalid input");
  EXPECT_EQ(action->error()->userInfo().string("stderr"),
            "Element 1 of the request cannot be written as a property list");
}

INSTANTIATE_TEST_SUITE_P(All, UnwritableNameTest, testing::ValuesIn(unwritableNames()), lumora::tests::nameOf);

} // namespace
