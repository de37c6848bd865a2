#include "SubmissionTest.h"

#include <cerrno>

namespace {

class SubmitDeathTest : public lumora::tests::SubmissionTest {
protected:
  using Text = std::optional<std::string>;

  SubmitDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }

  void submitFile(const Text& file, const Text& workflow) const {
    LMRActionFactory::
        actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
            file, workflow, userMetadata_, std::nullopt, false, false, session_);
  }

  void submitSource(const Text& file, const Text& submission) const {
    LMRActionFactory::
        actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
            file, submission, userMetadata_, std::nullopt, false, false, session_);
  }

  void submitFiles(const std::vector<std::string>& files, const Text& workflow) const {
    LMRActionFactory::actionToSubmitFiles_toWorkflow_metadata_asynchronous_deleteAfterSubmission_session(
        files, workflow, userMetadata_, false, false, session_);
  }

  void stopToWorkflow(const Text& workflow) const {
    LMRActionFactory::actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session("Studio A", workflow,
                                                                                        userMetadata_, session_);
  }

  void stopToSubmission(const Text& submission) const {
    LMRActionFactory::actionToStopRemoteCamera_andSubmitToSubmissionUUID_withMetadata_session("Studio A", submission,
                                                                                              userMetadata_, session_);
  }
};

TEST_F(SubmitDeathTest, file_stopsTheProcess_whenSomethingRequiredIsAbsent) {
  EXPECT_DEATH(submitFile(std::nullopt, std::nullopt),
               "file != nil, in actionToSubmitFile_toWorkflow_.* of LMRActionFactory");
  EXPECT_DEATH(submitFile("/tmp/take.mov", std::nullopt),
               "workflowName != nil, in actionToSubmitFile_toWorkflow_.* of LMRActionFactory");
}

TEST_F(SubmitDeathTest, source_stopsTheProcess_whenSomethingRequiredIsAbsent) {
  EXPECT_DEATH(submitSource(std::nullopt, std::nullopt),
               "file != nil, in actionToSubmitFile_toSubmissionUUID_.* of LMRActionFactory");
  EXPECT_DEATH(submitSource("/tmp/take.mov", std::nullopt),
               "submissionUUID != nil, in actionToSubmitFile_toSubmissionUUID_.* of LMRActionFactory");
}

TEST_F(SubmitDeathTest, files_stopsTheProcess_whenSomethingRequiredIsAbsent) {
  EXPECT_DEATH(submitFiles({}, std::nullopt), "\\[files count\\] > 0, in actionToSubmitFiles_.* of LMRActionFactory");
  EXPECT_DEATH(submitFiles({"/tmp/take.mov"}, std::nullopt),
               "workflowName != nil, in actionToSubmitFiles_.* of LMRActionFactory");
}

TEST_F(SubmitDeathTest, stop_stopsTheProcess_whenTheDestinationIsAbsent) {
  EXPECT_DEATH(stopToWorkflow(std::nullopt),
               "workflowName != nil, in actionToStopRemoteCamera_andSubmitToWorkflow_.* of LMRActionFactory");
  EXPECT_DEATH(stopToSubmission(std::nullopt),
               "submissionUUID != nil, in actionToStopRemoteCamera_andSubmitToSubmissionUUID_.* of LMRActionFactory");
}

TEST_F(SubmitDeathTest, stop_stopsTheProcess_whenTheMetadataCannotBeWritten) {
  platform_.files->setFailure(EROFS);
  EXPECT_DEATH(stopToWorkflow("Lectures"), "metadataFilePath != nil, in actionToStopRemoteCamera_andSubmitToWorkflow_");
  EXPECT_DEATH(stopToSubmission("B4C1"),
               "metadataFilePath != nil, in actionToStopRemoteCamera_andSubmitToSubmissionUUID_");
}

} // namespace
