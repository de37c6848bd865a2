#include "SubmissionTest.h"

#include <gmock/gmock.h>

#include <cerrno>

using lumora::Dictionary;
using lumora::tests::pair;
using testing::ElementsAre;
using testing::EndsWith;

namespace {

class SubmitActionTest : public lumora::tests::SubmissionTest {
protected:
  using Metadata = std::optional<Dictionary>;

  std::shared_ptr<LMRAction> toWorkflow(const Metadata& user, const Metadata& recording, bool asynchronous,
                                        bool deleting) const {
    return LMRActionFactory::
        actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
            "/tmp/take.mov", "Lectures", user, recording, asynchronous, deleting, session_);
  }

  std::shared_ptr<LMRAction> toSubmission(const Metadata& user, const Metadata& recording, bool asynchronous,
                                          bool deleting) const {
    return LMRActionFactory::
        actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
            "/tmp/take.mov", "B4C1", user, recording, asynchronous, deleting, session_);
  }

  std::shared_ptr<LMRAction> twoFiles(bool asynchronous, bool deleting) const {
    return LMRActionFactory::actionToSubmitFiles_toWorkflow_metadata_asynchronous_deleteAfterSubmission_session(
        {"/tmp/one.mov", "/tmp/two.mov"}, "Lectures", userMetadata_, asynchronous, deleting, session_);
  }
};

TEST_F(SubmitActionTest, toWorkflow_sendsEverythingInOrder) {
  const auto action = toWorkflow(userMetadata_, Dictionary{{"RecordingMetadata_DURATION", 12}}, true, true);
  EXPECT_EQ(action->command(), "submit");
  EXPECT_THAT(*action->arguments(), ElementsAre(pair("async"), pair("delete"), pair("file", "/tmp/take.mov"),
                                                pair("metadata", argument(*action, "metadata")),
                                                pair("recording_metadata", argument(*action, "recording_metadata")),
                                                pair("workflow", "Lectures")));
  EXPECT_THAT(argument(*action, "metadata"), EndsWith(".plist"));
  EXPECT_THAT(argument(*action, "recording_metadata"), EndsWith(".xml"));
}

TEST_F(SubmitActionTest, toWorkflow_sendsTheNeededOnly_whenNothingElseIsAskedFor) {
  const auto action = toWorkflow(userMetadata_, std::nullopt, false, false);
  EXPECT_THAT(*action->arguments(),
              ElementsAre(pair("file", "/tmp/take.mov"), pair("metadata", argument(*action, "metadata")),
                          pair("workflow", "Lectures")));
}

TEST_F(SubmitActionTest, toSubmission_endsWithTheSubmissionUUID) {
  const auto action = toSubmission(userMetadata_, Dictionary(), true, false);
  EXPECT_THAT(*action->arguments(),
              ElementsAre(pair("async"), pair("file", "/tmp/take.mov"), pair("metadata", argument(*action, "metadata")),
                          pair("recording_metadata", argument(*action, "recording_metadata")),
                          pair("submission_uuid", "B4C1")));
}

TEST_F(SubmitActionTest, files_sendsEachFileInOrder) {
  const auto action = twoFiles(true, true);
  EXPECT_THAT(*action->arguments(),
              ElementsAre(pair("async"), pair("delete"), pair("file", "/tmp/one.mov"), pair("file", "/tmp/two.mov"),
                          pair("metadata", argument(*action, "metadata")), pair("workflow", "Lectures")));
}

TEST_F(SubmitActionTest, expectsNoReplyAndCarriesTheSessionAndSaysThatItSubmits) {
  for (const auto& action : {toWorkflow(userMetadata_, std::nullopt, false, false),
                             toSubmission(userMetadata_, std::nullopt, false, false), twoFiles(false, false)}) {
    EXPECT_EQ(action->command(), "submit");
    EXPECT_FALSE(action->expectXMLResponse());
    EXPECT_EQ(action->session(), session_);
    EXPECT_EQ(action->description(), "Submitting files…");
  }
}

TEST_F(SubmitActionTest, files_sendsNoAsync_whenTheServerIsALibraryServer) {
  session_->setIsLumoraLibraryServer(true);
  EXPECT_EQ(twoFiles(true, false)->arguments()->at(0), pair("file", "/tmp/one.mov"));
}

TEST_F(SubmitActionTest, oneFile_sendsAsync_whenTheServerIsALibraryServer) {
  session_->setIsLumoraLibraryServer(true);
  EXPECT_EQ(toWorkflow(userMetadata_, std::nullopt, true, false)->arguments()->at(0), pair("async"));
  EXPECT_EQ(toSubmission(userMetadata_, std::nullopt, true, false)->arguments()->at(0), pair("async"));
}

TEST_F(SubmitActionTest, files_sendsAsync_whenThereIsNoSession) {
  session_ = nullptr;
  EXPECT_EQ(twoFiles(true, false)->arguments()->at(0), pair("async"));
}

TEST_F(SubmitActionTest, sendsMetadataAlone_whenTheUserMetadataAreAbsent) {
  EXPECT_THAT(*toWorkflow(std::nullopt, std::nullopt, false, false)->arguments(),
              ElementsAre(pair("file", "/tmp/take.mov"), pair("metadata"), pair("workflow", "Lectures")));
}

TEST_F(SubmitActionTest, sendsTheKeysAlone_whenTheFilesCannotBeWritten) {
  platform_.files->setFailure(ENOSPC);
  EXPECT_THAT(*toWorkflow(userMetadata_, Dictionary(), false, false)->arguments(),
              ElementsAre(pair("file", "/tmp/take.mov"), pair("metadata"), pair("recording_metadata"),
                          pair("workflow", "Lectures")));
}

TEST_F(SubmitActionTest, writesTheUserMetadataAsAPropertyList) {
  const auto action = toWorkflow(userMetadata_, std::nullopt, false, false);
  EXPECT_EQ(lumora::dictionaryWithXMLDescription(content(argument(*action, "metadata"))), userMetadata_);
}

// A remote camera is stopped and its recording submitted in one command.

TEST_F(SubmitActionTest, stopToWorkflow_sendsNoCommandAndThreePairs) {
  const auto action = LMRActionFactory::actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session(
      "Studio A", "Lectures", userMetadata_, session_);
  EXPECT_EQ(action->command(), std::nullopt);
  EXPECT_THAT(*action->arguments(),
              ElementsAre(pair("stop", "Studio A"), pair("metadata", argument(*action, "metadata")),
                          pair("workflow", "Lectures")));
  EXPECT_TRUE(action->expectXMLResponse());
  EXPECT_EQ(action->session(), session_);
  EXPECT_EQ(action->description(), "Stopping and submitting remote camera recording…");
}

TEST_F(SubmitActionTest, stopToSubmission_endsWithTheSubmissionUUID) {
  const auto action = LMRActionFactory::actionToStopRemoteCamera_andSubmitToSubmissionUUID_withMetadata_session(
      "Studio A", "B4C1", userMetadata_, session_);
  EXPECT_EQ(action->command(), std::nullopt);
  EXPECT_THAT(*action->arguments(),
              ElementsAre(pair("stop", "Studio A"), pair("metadata", argument(*action, "metadata")),
                          pair("submission_uuid", "B4C1")));
  EXPECT_TRUE(action->expectXMLResponse());
  EXPECT_EQ(action->description(), "Stopping and submitting remote camera recording…");
}

TEST_F(SubmitActionTest, stop_sendsItsKeyAlone_whenTheCameraIsAbsent) {
  const auto action = LMRActionFactory::actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session(
      std::nullopt, "Lectures", userMetadata_, session_);
  EXPECT_EQ(action->arguments()->at(0), pair("stop"));
}

} // namespace
