#include "support/Boxes.h"
#include "support/Sessions.h"

#include <LumoraKit/actions/LMRMetadataKeys.h>
#include <LumoraKit/recording/LMRUnfinishedRecording.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/ManualQueues.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <chrono>

namespace {

using lumora::fakes::ToolReply;
using lumora::tests::movie;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using State = LMRMovieFile::State;

constexpr int noResponse = 22;

// A camera, a studio's camera and the screen, whose application has died.
class UnfinishedRecording : public testing::Test {
protected:
  UnfinishedRecording() {
    auto platform = lumora::Platform::current();
    platform.queues = queues_;
    platform.mainThread = queues_->mainThread();
    lumora::Platform::install(platform);
    platform_.files->createDirectory("/movies");
    write("/movies/camera.mov", movie() + "torn");
    write("/movies/screen.mov", movie());
    note_.began = lumora::Date(std::chrono::seconds(1'264'000'000));
    note_.workflowUUID = "W";
    note_.userMetadata = {{"Title", "Lecture"}};
    note_.setSession(*session_);
    note_.sources = {{"LMRLocalVideoRecorder", "Camera", "/movies/camera.mov", ""},
                     {"LMRRemoteVideoRecorder", "Studio A", "", ""},
                     {"LMRLocalScreenRecorder", "Screen", "/movies/screen.mov", ""}};
    queue_ = LMRSubmissionQueue::queueWithFolder_error("/queue", nullptr);
    platform_.toolRunner->reply(
        "create_recording",
        ToolReply::success({{"recording_uuid", "R"}, {"submission_uuids", lumora::Array{"S1", "S2", "S3"}}}));
  }

  void write(const std::filesystem::path& file, const std::string& content) {
    EXPECT_EQ(platform_.files->writeAtomically(file, content), nullptr);
  }
  // What the next start of the application finds.
  std::vector<std::shared_ptr<LMRUnfinishedRecording>> foundAgain() {
    found_.reset();
    return LMRUnfinishedRecording::unfinishedRecordingsInJournal(
        LMRRecordingJournal::journalWithFolder_error("/notes", nullptr));
  }
  LMRUnfinishedRecording& found() {
    EXPECT_EQ(LMRRecordingJournal::journalWithFolder_error("/notes", nullptr)->open(note_), nullptr);
    const auto recordings = foundAgain();
    EXPECT_THAT(recordings, SizeIs(1));
    found_ = recordings.at(0);
    return *found_;
  }
  std::vector<std::string> queued() const {
    std::vector<std::string> uuids;
    for (const auto& submission : queue_->submissions()) {
      uuids.push_back(submission.submissionUUID);
    }
    return uuids;
  }
  LMRErrorRef submit() { return found_->submitToQueue_session_deleteAfterSubmission(*queue_, *session_, false); }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::fakes::ManualQueues> queues_ = std::make_shared<lumora::fakes::ManualQueues>();
  std::shared_ptr<LMRSession> session_ = lumora::tests::passwordSession();
  std::shared_ptr<LMRSubmissionQueue> queue_;
  LMRRecordingNote note_;
  std::shared_ptr<LMRUnfinishedRecording> found_;
};

TEST_F(UnfinishedRecording, isFoundWithItsMovies) {
  const auto& recording = found();
  EXPECT_EQ(recording.note().userMetadata.string("Title"), "Lecture");
  ASSERT_THAT(recording.movies(), SizeIs(2));
  EXPECT_EQ(recording.movies()[0].file, "/movies/camera.mov");
  EXPECT_EQ(recording.movies()[0].state, State::Torn);
  EXPECT_DOUBLE_EQ(recording.movies()[0].duration, 1.6);
  EXPECT_EQ(recording.movies()[1].state, State::Complete);
  EXPECT_TRUE(recording.isUsable());
}

TEST_F(UnfinishedRecording, isSubmitted_afterRepairAndANewContainer) {
  auto& recording = found();
  EXPECT_EQ(recording.repair(), nullptr);
  EXPECT_EQ(recording.movies()[0].state, State::Complete);
  EXPECT_EQ(recording.prepareSubmissionWithSession(session_), nullptr);
  EXPECT_EQ(submit(), nullptr);
  EXPECT_THAT(queued(), ElementsAre("S1", "S3"));
  EXPECT_EQ(platform_.files->content("/movies/camera.mov"), movie());
  EXPECT_THAT(foundAgain(), IsEmpty());
}

TEST_F(UnfinishedRecording, tellsTheServerWhenItBeganAndHowLongItIs) {
  auto& recording = found();
  recording.repair();
  recording.prepareSubmissionWithSession(session_);
  const auto submissions = recording.submissions();
  ASSERT_THAT(submissions, SizeIs(2));
  EXPECT_EQ(submissions[0].name, "Camera");
  EXPECT_EQ(submissions[1].name, "Screen");
  EXPECT_EQ(submissions[0].userMetadata.string("Title"), "Lecture");
  const auto& metadata = submissions[0].recordingMetadata;
  EXPECT_EQ(*metadata.find(LMREpisodeRecordingMetadataStartDateKey), lumora::Value(note_.began));
  EXPECT_EQ(*metadata.find(LMREpisodeRecordingMetadataStopDateKey),
            lumora::Value(note_.began + std::chrono::seconds(2)));
  EXPECT_EQ(*metadata.find(LMREpisodeRecordingMetadataDurationKey), lumora::Value(1.6));
}

TEST_F(UnfinishedRecording, hasAnEnd_whateverItsFileClaims) {
  using namespace lumora::tests;
  const auto time = box("tfdt", versionAndFlags(0, 1) + number(~std::uint64_t{0}, 8));
  const auto header = box("tfhd", versionAndFlags(0) + number(1));
  write("/movies/screen.mov", fileType() + index() + box("moof", box("traf", header + time)) + box("mdat", ""));
  note_.sources[2].submissionUUID = "S";
  const auto& recording = found();
  EXPECT_GT(recording.movies()[1].duration, 1e15);
  EXPECT_EQ(*recording.submissions().at(0).recordingMetadata.find(LMREpisodeRecordingMetadataStopDateKey),
            lumora::Value(note_.began + std::chrono::duration_cast<std::chrono::seconds>(std::chrono::years(1))));
}

TEST_F(UnfinishedRecording, makesNoContainer_whenItWasStopped) {
  note_.sources[0].submissionUUID = "A";
  note_.sources[1].submissionUUID = "B";
  note_.sources[2].submissionUUID = "C";
  auto& recording = found();
  recording.repair();
  EXPECT_EQ(recording.prepareSubmissionWithSession(session_), nullptr);
  EXPECT_THAT(platform_.toolRunner->commands(), IsEmpty());
  EXPECT_EQ(submit(), nullptr);
  EXPECT_THAT(queued(), ElementsAre("A", "C"));
}

TEST_F(UnfinishedRecording, makesOneContainer_alsoWhenTheApplicationDiesAgain) {
  EXPECT_EQ(found().prepareSubmissionWithSession(session_), nullptr);
  const auto again = foundAgain();
  ASSERT_THAT(again, SizeIs(1));
  EXPECT_EQ(again[0]->prepareSubmissionWithSession(session_), nullptr);
  EXPECT_EQ(again[0]->note().sources[2].submissionUUID, "S3");
  EXPECT_THAT(platform_.toolRunner->commands(), ElementsAre("create_recording"));
}

TEST_F(UnfinishedRecording, isQueuedOnce_whenItsApplicationDiedAfterAddingSome) {
  auto& recording = found();
  recording.repair();
  recording.prepareSubmissionWithSession(session_);
  EXPECT_EQ(queue_->add(recording.submissions()[0], *session_), nullptr);
  EXPECT_EQ(submit(), nullptr);
  EXPECT_THAT(queued(), ElementsAre("S1", "S3"));
}

TEST_F(UnfinishedRecording, stays_whenTheServerOrTheDiskRefuses) {
  platform_.toolRunner->replyOnce("create_recording", ToolReply::failure(noResponse));
  auto& recording = found();
  recording.repair();
  const auto error = recording.prepareSubmissionWithSession(session_);
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), noResponse);
  EXPECT_NE(submit(), nullptr);
  EXPECT_EQ(recording.prepareSubmissionWithSession(session_), nullptr);
  platform_.files->setFailure(ENOSPC);
  EXPECT_NE(submit(), nullptr);
  EXPECT_NE(recording.keep(), nullptr);
  EXPECT_NE(recording.discard(), nullptr);
  platform_.files->setFailure(0);
  EXPECT_THAT(queued(), IsEmpty());
  EXPECT_THAT(foundAgain(), SizeIs(1));
}

TEST_F(UnfinishedRecording, isNotSubmitted_whileAMovieIsTorn) {
  EXPECT_EQ(found().prepareSubmissionWithSession(session_), nullptr);
  EXPECT_NE(submit(), nullptr);
  EXPECT_THAT(queued(), IsEmpty());
}

TEST_F(UnfinishedRecording, isNotSubmitted_forAnotherServerOrWithoutAWorkflow) {
  auto& recording = found();
  recording.repair();
  const auto other = lumora::tests::passwordSession();
  other->setServer("other.example.org");
  EXPECT_NE(recording.prepareSubmissionWithSession(other), nullptr);
  EXPECT_EQ(recording.prepareSubmissionWithSession(session_), nullptr);
  EXPECT_NE(recording.submitToQueue_session_deleteAfterSubmission(*queue_, *other, false), nullptr);
  EXPECT_THAT(queued(), IsEmpty());
}

TEST_F(UnfinishedRecording, takesWhatBecomesKnown_whenNobodyHadLoggedIn) {
  note_.workflowUUID.clear();
  note_.setSession(*LMRSession::session());
  auto& recording = found();
  recording.repair();
  EXPECT_NE(recording.prepareSubmissionWithSession(session_), nullptr);
  auto note = recording.note();
  note.workflowUUID = "W";
  note.setSession(*session_);
  EXPECT_EQ(recording.setNote(note), nullptr);
  EXPECT_EQ(recording.prepareSubmissionWithSession(session_), nullptr);
  EXPECT_EQ(submit(), nullptr);
  EXPECT_THAT(queued(), ElementsAre("S1", "S3"));
}

TEST_F(UnfinishedRecording, isNotSubmitted_whenTheWorkflowTakesFewerSources) {
  platform_.toolRunner->reply("create_recording", ToolReply::success({{"submission_uuids", lumora::Array{"S1"}}}));
  auto& recording = found();
  EXPECT_NE(recording.prepareSubmissionWithSession(session_), nullptr);
  EXPECT_EQ(recording.note().sources[0].submissionUUID, "");
}

TEST_F(UnfinishedRecording, submitsWhatCanBePlayed_andLeavesTheRestAlone) {
  write("/movies/screen.mov", "too short");
  auto& recording = found();
  EXPECT_EQ(recording.repair(), nullptr);
  EXPECT_EQ(recording.prepareSubmissionWithSession(session_), nullptr);
  EXPECT_EQ(submit(), nullptr);
  EXPECT_THAT(queued(), ElementsAre("S1"));
  EXPECT_EQ(platform_.files->content("/movies/screen.mov"), "too short");
}

TEST_F(UnfinishedRecording, isNotUsable_whenNothingWasWritten) {
  platform_.files->removeFile("/movies/camera.mov");
  write("/movies/screen.mov", "");
  auto& recording = found();
  EXPECT_FALSE(recording.isUsable());
  EXPECT_EQ(recording.movies()[0].state, State::Missing);
  EXPECT_EQ(recording.prepareSubmissionWithSession(session_), nullptr);
  EXPECT_NE(submit(), nullptr);
  EXPECT_EQ(recording.discard(), nullptr);
  EXPECT_THAT(foundAgain(), IsEmpty());
}

TEST_F(UnfinishedRecording, leavesItsFiles_whenKept) {
  EXPECT_EQ(found().keep(), nullptr);
  EXPECT_EQ(platform_.files->content("/movies/camera.mov"), movie() + "torn");
  EXPECT_THAT(foundAgain(), IsEmpty());
}

TEST_F(UnfinishedRecording, losesItsFiles_whenDiscarded) {
  EXPECT_EQ(found().discard(), nullptr);
  EXPECT_FALSE(platform_.files->content("/movies/camera.mov"));
  EXPECT_FALSE(platform_.files->content("/movies/screen.mov"));
  EXPECT_THAT(foundAgain(), IsEmpty());
}

TEST_F(UnfinishedRecording, repairsWhatItCan_whenOneFileCannotBe) {
  write("/movies/screen.mov", movie() + "torn as well");
  auto& recording = found();
  write("/movies/camera.mov", movie() + "written by somebody");
  EXPECT_NE(recording.repair(), nullptr);
  EXPECT_EQ(recording.movies()[0].state, State::Torn);
  EXPECT_EQ(recording.movies()[1].state, State::Complete);
}

} // namespace
