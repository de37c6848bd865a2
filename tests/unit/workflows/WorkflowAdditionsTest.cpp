#include "support/ToolArguments.h"

#include <LumoraKit/workflows/LMRWorkflowAdditions.h>
#include <LumoraKit/workflows/LMRWorkflowAdditionsInternal.h>

#include <gtest/gtest.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::Value;
using namespace LMRWorkflowAdditions;
namespace Internal = LMRWorkflowAdditionsInternal;

namespace {

Dictionary source(Array sourceTypes) {
  return {{"sourceTypes", std::move(sourceTypes)}};
}

Dictionary folder(Array sourceTypes) {
  return {{"sourceTypes", std::move(sourceTypes)}, {"isFolder", true}};
}

Dictionary workflow(Array sources) {
  return {{"name", "a"}, {"sources", std::move(sources)}};
}

TEST(WorkflowAdditionsTest, isOfSound_whenTheOneSourceTakesAudio) {
  const auto described = workflow({source({"Audio"})});
  EXPECT_TRUE(acceptsAudio(described));
  EXPECT_FALSE(acceptsVideo(described));
  EXPECT_FALSE(acceptsScreen(described));
  EXPECT_FALSE(acceptsDual(described));
  EXPECT_EQ(workflowType(described), LMRWorkflowTypeSingleSource);
}

TEST(WorkflowAdditionsTest, isOfAFolder_whenTheOneSourceTakesAFolderOfFiles) {
  const auto described = workflow({folder({"File"})});
  EXPECT_EQ(workflowType(described), LMRWorkflowTypeFolder);
  EXPECT_FALSE(acceptsVideo(described) || acceptsScreen(described) || acceptsAudio(described) ||
               acceptsDual(described));
}

TEST(WorkflowAdditionsTest, isUnsupported_whenTheOneSourceTakesAFolderOfVideos) {
  const auto described = workflow({folder({"Video"})});
  EXPECT_EQ(workflowType(described), LMRWorkflowTypeUnsupported);
  EXPECT_FALSE(acceptsVideo(described));
}

TEST(WorkflowAdditionsTest, isDual_whenTheSourcesTakeCameraAndScreen) {
  const auto described = workflow({source({"Video"}), source({"Screen"})});
  EXPECT_TRUE(acceptsDual(described));
  EXPECT_EQ(workflowType(described), LMRWorkflowTypeDualSource);
}

TEST(WorkflowAdditionsTest, acceptsNoDualButIsOfTwoSources_whenOneTakesAudio) {
  const auto described = workflow({source({"Audio"}), source({"Video"})});
  EXPECT_FALSE(acceptsDual(described));
  EXPECT_EQ(workflowType(described), LMRWorkflowTypeDualSource);
}

TEST(WorkflowAdditionsTest, isUnsupported_whenOneOfTwoSourcesIsAFolder) {
  const auto described = workflow({source({"Video"}), folder({"Video"})});
  EXPECT_FALSE(acceptsDual(described));
  EXPECT_EQ(workflowType(described), LMRWorkflowTypeUnsupported);
}

TEST(WorkflowAdditionsTest, isUnsupported_whenThereAreNoOrThreeSources) {
  EXPECT_EQ(workflowType(workflow({})), LMRWorkflowTypeUnsupported);
  EXPECT_EQ(workflowType({}), LMRWorkflowTypeUnsupported);
  EXPECT_EQ(workflowType(workflow({source({"Video"}), source({"Video"}), source({"Video"})})),
            LMRWorkflowTypeUnsupported);
}

TEST(WorkflowAdditionsTest, matchesNothing_whenASourceTypeIsInAnotherCase) {
  const auto described = workflow({source({"video"})});
  EXPECT_FALSE(acceptsVideo(described));
  EXPECT_EQ(workflowType(described), LMRWorkflowTypeUnsupported);
}

TEST(WorkflowAdditionsTest, supportsEveryContentType) {
  EXPECT_TRUE(supportsFileContentType({}, ""));
  EXPECT_TRUE(supportsFileContentType({}, "public.movie"));
  EXPECT_TRUE(supportsFileContentType(workflow({source({"Video"})}), "no/type"));
}

TEST(WorkflowAdditionsTest, typesHaveTheirNumbers) {
  EXPECT_EQ(LMRWorkflowTypeUnsupported, 0);
  EXPECT_EQ(LMRWorkflowTypeSingleSource, 1);
  EXPECT_EQ(LMRWorkflowTypeDualSource, 2);
  EXPECT_EQ(LMRWorkflowTypeFolder, 3);
  EXPECT_EQ(sizeof(LMRWorkflowType), 4U);
}

TEST(WorkflowAdditionsTest, areOnlyNumbersAndFlagsTrueForAFolder) {
  for (const Value& yes : {Value(true), Value(1), Value(1U), Value(1.0)}) {
    EXPECT_TRUE(Internal::anySourceRequiresFolderSubmission(workflow({Dictionary{{"isFolder", yes}}})));
  }
  for (const Value& no : {Value(false), Value(0), Value(2), Value(-1), Value(1.5), Value("true"), Value("1"),
                          Value(Array{true}), Value(lumora::Data{1})}) {
    EXPECT_FALSE(Internal::anySourceRequiresFolderSubmission(workflow({Dictionary{{"isFolder", no}}})))
        << no.description();
  }
}

TEST(WorkflowAdditionsTest, hasNoSources_whenTheListIsOfAnotherType) {
  for (const Value& wrong : {Value("Video"), Value(3), Value(Dictionary{{"sourceTypes", Array{"Video"}}})}) {
    const Dictionary described{{"sources", wrong}};
    EXPECT_EQ(Internal::sources(described), nullptr);
    EXPECT_EQ(Internal::numberOfSources(described), 0);
    EXPECT_FALSE(Internal::anySourceRequiresFolderSubmission(described));
    EXPECT_EQ(workflowType(described), LMRWorkflowTypeUnsupported);
  }
}

TEST(WorkflowAdditionsTest, sourceSupportsNothing_whenItOrItsTypesAreOfAnotherType) {
  for (const Value& wrong :
       {Value("Video"), Value(Array{"Video"}), Value(Dictionary{}), Value(Dictionary{{"sourceTypes", "Video"}}),
        Value(Dictionary{{"sourceTypes", Array{Array{"Video"}, 1}}})}) {
    EXPECT_FALSE(Internal::supportsSourceType_forSourceAtIndex(workflow({wrong}), "Video", 0)) << wrong.description();
    EXPECT_EQ(workflowType(workflow({wrong})), LMRWorkflowTypeUnsupported);
  }
}

TEST(WorkflowAdditionsDeathTest, stopsTheProcess_whenTheIndexIsOfNoSource) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  const auto described = workflow({source({"Video"})});
  EXPECT_DEATH(Internal::supportsSourceType_forSourceAtIndex(described, "Video", 1), "LMRWorkflowAdditions");
  EXPECT_DEATH(Internal::supportsSourceType_forSourceAtIndex(described, "Video", -1), "LMRWorkflowAdditions");
}

} // namespace
