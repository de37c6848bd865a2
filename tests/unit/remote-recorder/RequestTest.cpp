#include "RemoteRecorderTest.h"

namespace {

using lumora::Array;
using lumora::Dictionary;
using lumora::tests::pair;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

class RemoteRequest : public RemoteRecorderTest {};
using RemoteRequestDeathTest = RemoteRequest;

TEST_F(RemoteRequest, startSendsADelayOfZero_whenItIsSevenTenths) {
  recorder_->startWithDelay(0.7);
  EXPECT_EQ(request(), afterLogin({pair("start", "Studio A"), pair("delay", 0)}));
  EXPECT_EQ(recorder_->delayBeforeRecording(), 0U);
}

TEST_F(RemoteRequest, startSendsADelayOfFive_whenItIsFive) {
  recorder_->startWithDelay(5.0);
  EXPECT_EQ(request(), afterLogin({pair("start", "Studio A"), pair("delay", 5)}));
  EXPECT_EQ(recorder_->delayBeforeRecording(), 5U);
}

TEST_F(RemoteRequest, startCutsOffTheFractionOfItsDelay) {
  recorder_->startWithDelay(2.9);
  EXPECT_EQ(recorder_->delayBeforeRecording(), 2U);
}

TEST_F(RemoteRequest, startKeepsDelaysBeyondTheSignedRange) {
  recorder_->startWithDelay(0x1p63);
  EXPECT_EQ(recorder_->delayBeforeRecording(), std::uint64_t{1} << 63U);
  EXPECT_EQ(request(), afterLogin({pair("start", "Studio A"), pair("delay", std::uint64_t{1} << 63U)}));
}

TEST_F(RemoteRequest, startSendsNoDelay_whenNoNumberHoldsIt) {
  for (const double delay : {-1.0, 0x1p64, std::numeric_limits<double>::quiet_NaN()}) {
    recorder_->startWithDelay(delay);
    EXPECT_EQ(recorder_->delayBeforeRecording(), 0U) << delay;
  }
}

TEST_F(RemoteRequest, pauseAndResumeAndCancelNameTheCamera) {
  recorder_->pause();
  EXPECT_EQ(request(), afterLogin({pair("pause", "Studio A")}));
  recorder_->resume();
  EXPECT_EQ(request(), afterLogin({pair("resume", "Studio A")}));
  recorder_->cancel();
  EXPECT_EQ(request(), afterLogin({pair("cancel", "Studio A")}));
}

TEST_F(RemoteRequest, goesToTheMainToolOnItsStandardInput) {
  recorder_->pause();
  const auto sent = platform_.toolRunner->requests().back();
  EXPECT_EQ(sent.executable, "/usr/bin/lumctl");
  EXPECT_THAT(sent.arguments, testing::ElementsAre("--plistin"));
  EXPECT_EQ(sent.standardInput, *lumora::xmlDescription(afterLogin({pair("pause", "Studio A")})));
}

TEST_F(RemoteRequest, stopUsesTheSubmissionForm_whenSubmissionUUIDAndWorkflowAreBothSet) {
  recorder_->setWorkflow("single-video");
  recorder_->setSubmissionUUID("AAAA");
  recorder_->stop();
  EXPECT_EQ(request(),
            afterLogin({pair("stop", "Studio A"), pair("metadata", metadataFile()), pair("submission_uuid", "AAAA")}));
}

TEST_F(RemoteRequest, stopUsesTheWorkflowForm_whenThereIsNoSubmissionUUID) {
  recorder_->setWorkflow("single-video");
  recorder_->stop();
  EXPECT_EQ(request(),
            afterLogin({pair("stop", "Studio A"), pair("metadata", metadataFile()), pair("workflow", "single-video")}));
}

TEST_F(RemoteRequest, stopSendsAnEmptyTitleAndDescription_whenTheOwnerSetTheMetadataToNothing) {
  recorder_->setWorkflow("single-video");
  recorder_->setMetadata(std::nullopt);
  recorder_->stop();
  EXPECT_EQ(sentMetadata(), (Dictionary{{"Title", ""}, {"Description", ""}}));
  EXPECT_EQ(recorder_->metadata(), sentMetadata());
}

TEST_F(RemoteRequest, stopSendsTheInitialEmptyDictionaryAsItIs) {
  recorder_->setWorkflow("single-video");
  recorder_->stop();
  EXPECT_THAT(metadataFile(), Not(IsEmpty()));
  EXPECT_EQ(sentMetadata(), Dictionary());
}

TEST_F(RemoteRequest, stopSendsTheOwnersMetadata) {
  recorder_->setWorkflow("single-video");
  recorder_->setMetadata(Dictionary{{"Title", "Lecture 1"}, {"Speaker", "Ada"}});
  recorder_->stop();
  EXPECT_EQ(sentMetadata(), (Dictionary{{"Title", "Lecture 1"}, {"Speaker", "Ada"}}));
}

TEST_F(RemoteRequest, audioRecorderSendsAudioOnlyOnStartAndIsOtherwiseIdentical) {
  const auto recorder = make<LMRRemoteAudioRecorder>();
  recorder->setSubmissionUUID("AAAA");
  recorder->startWithDelay(5.0);
  EXPECT_EQ(request(), afterLogin({pair("start", "Studio A"), pair("delay", 5), "audio_only"}));
  recorder->pause();
  EXPECT_EQ(request(), afterLogin({pair("pause", "Studio A")}));
  recorder->resume();
  EXPECT_EQ(request(), afterLogin({pair("resume", "Studio A")}));
  recorder->stop();
  EXPECT_EQ(request(),
            afterLogin({pair("stop", "Studio A"), pair("metadata", metadataFile()), pair("submission_uuid", "AAAA")}));
  recorder->cancel();
  EXPECT_EQ(request(), afterLogin({pair("cancel", "Studio A")}));
}

TEST_F(RemoteRequest, usesTheNameAndTheSessionOfThatMoment) {
  recorder_->setRemoteRecorderName("Studio B");
  recorder_->setSession(lumora::tests::kerberosSession());
  recorder_->pause();
  EXPECT_EQ(request(),
            (Array{pair("server", "lumora.example.org:8170"), pair("auth", "Kerberos"), pair("pause", "Studio B")}));
}

TEST_F(RemoteRequest, sendsTheVerbAlone_whenThereIsNoName) {
  recorder_->setRemoteRecorderName(std::nullopt);
  recorder_->pause();
  EXPECT_EQ(request(), afterLogin({pair("pause")}));
}

TEST_F(RemoteRequestDeathTest, stopIsRefused_whenThereIsNeitherSubmissionNorWorkflow) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_DEATH(recorder_->stop(), "workflowName != nil");
}

} // namespace
