// Workflow descriptions in which anything stands anywhere.
#include "FieldValues.h"

#include <LumoraKit/workflows/LMRWorkflowAdditions.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::tests::FieldValue;
using namespace LMRWorkflowAdditions;

namespace {

class WorkflowReplyTest : public testing::TestWithParam<FieldValue> {
protected:
  static void expectUnsupported(const Dictionary& workflow) {
    EXPECT_FALSE(acceptsVideo(workflow));
    EXPECT_FALSE(acceptsScreen(workflow));
    EXPECT_FALSE(acceptsAudio(workflow));
    EXPECT_FALSE(acceptsDual(workflow));
    EXPECT_TRUE(supportsFileContentType(workflow, "public.movie"));
    EXPECT_EQ(workflowType(workflow), LMRWorkflowTypeUnsupported);
  }
};

TEST_P(WorkflowReplyTest, isUnsupported_whenTheSourcesAreThat) {
  expectUnsupported({{"sources", GetParam().make()}});
}

TEST_P(WorkflowReplyTest, isUnsupported_whenASourceIsThat) {
  expectUnsupported({{"sources", Array{GetParam().make()}}});
  expectUnsupported({{"sources", Array{GetParam().make(), GetParam().make()}}});
}

TEST_P(WorkflowReplyTest, isUnsupported_whenTheTypesAreThat) {
  expectUnsupported({{"sources", Array{Dictionary{{"sourceTypes", GetParam().make()}}}}});
}

TEST_P(WorkflowReplyTest, isAFolder_onlyWhenTheFlagIsTrue) {
  const Dictionary source{{"sourceTypes", Array{"File"}}, {"isFolder", GetParam().make()}};
  EXPECT_EQ(workflowType({{"sources", Array{source}}}),
            GetParam().name == "flag" ? LMRWorkflowTypeFolder : LMRWorkflowTypeSingleSource);
}

INSTANTIATE_TEST_SUITE_P(All, WorkflowReplyTest, testing::ValuesIn(lumora::tests::fieldValues()),
                         lumora::tests::nameOf);

} // namespace
