#include "support/Sessions.h"

#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/recording/LMRRecordingNote.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/FakeRecorders.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>

namespace {

using lumora::fakes::FakeLocalRecorder;
using lumora::fakes::FakeRemoteRecorder;
using testing::SizeIs;

class RecordingNote : public testing::Test {
protected:
  RecordingNote() {
    camera_->setOutputFileURL("/movies/camera.mov");
    screen_->setOutputFileURL("/movies/screen.mov");
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<FakeLocalRecorder> camera_ = FakeLocalRecorder::make();
  std::shared_ptr<FakeLocalRecorder> screen_ = FakeLocalRecorder::make();
  std::shared_ptr<FakeRemoteRecorder> studio_ = FakeRemoteRecorder::make("Studio A");
  std::shared_ptr<LMRSession> session_ = lumora::tests::passwordSession();
};

TEST_F(RecordingNote, takesARecorderOfSeveralSources_inItsSubmissionOrder) {
  const auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders({camera_, screen_, studio_});
  recorder->setSourceRecorderSubmissionOrder({2, 0, 1});
  recorder->setWorkflowUUID("W");
  recorder->setSession(session_);
  recorder->setMetadata(lumora::Dictionary{{"Title", "Lecture"}});
  const auto note = LMRRecordingNote::noteWithRecorder(recorder);
  EXPECT_EQ(note.began, std::chrono::floor<std::chrono::seconds>(platform_.wallClock->now()));
  EXPECT_EQ(note.workflowUUID, "W");
  EXPECT_EQ(note.userMetadata.string("Title"), "Lecture");
  EXPECT_TRUE(note.isFor(*session_));
  ASSERT_THAT(note.sources, SizeIs(3));
  EXPECT_EQ(note.sources[0].name, "Studio A");
  EXPECT_FALSE(note.sources[0].isLocal());
  EXPECT_EQ(note.sources[1].file, "/movies/camera.mov");
  EXPECT_EQ(note.sources[1].recorder, "LMRLocalVideoRecorder");
  EXPECT_EQ(note.sources[2].file, "/movies/screen.mov");
}

TEST_F(RecordingNote, takesARecorderOfOneSource_withoutWorkflowAndSession) {
  const auto note = LMRRecordingNote::noteWithRecorder(camera_);
  ASSERT_THAT(note.sources, SizeIs(1));
  EXPECT_EQ(note.sources[0].file, "/movies/camera.mov");
  EXPECT_EQ(note.workflowUUID, "");
  EXPECT_EQ(note.server, "");
  EXPECT_FALSE(note.isFor(*session_));
  EXPECT_FALSE(note.hasSubmissionUUIDs());
}

TEST_F(RecordingNote, takesTheSubmissionUUIDs_andKeepsTheNamesGivenToSources) {
  const auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders({camera_, studio_});
  auto note = LMRRecordingNote::noteWithRecorder(recorder);
  note.sources[0].name = "Built-in camera";
  camera_->setSubmissionUUID("S1");
  studio_->setSubmissionUUID("S2");
  note.takeSourcesOf(recorder);
  ASSERT_THAT(note.sources, SizeIs(2));
  EXPECT_EQ(note.sources[0].name, "Built-in camera");
  EXPECT_EQ(note.sources[0].submissionUUID, "S1");
  EXPECT_EQ(note.sources[1].name, "Studio A");
  EXPECT_EQ(note.sources[1].submissionUUID, "S2");
  EXPECT_TRUE(note.hasSubmissionUUIDs());
}

TEST_F(RecordingNote, isTheSame_whenReadAgain) {
  const auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders({camera_, studio_});
  recorder->setSession(session_);
  const auto kept = LMRRecordingNote::noteWithRecorder(recorder).dictionaryRepresentation();
  const auto note = LMRRecordingNote::noteWithDictionary(kept);
  ASSERT_TRUE(note);
  EXPECT_EQ(note->dictionaryRepresentation(), kept);
}

TEST_F(RecordingNote, isRefused_whenSomethingIsMissingOrOfAWrongType) {
  const auto kept = LMRRecordingNote::noteWithRecorder(camera_).dictionaryRepresentation();
  for (const auto& [key, value] : kept) {
    auto incomplete = kept;
    incomplete.remove(key);
    EXPECT_FALSE(LMRRecordingNote::noteWithDictionary(incomplete)) << key;
    auto wrong = kept;
    wrong.set(key, 1.5);
    EXPECT_FALSE(LMRRecordingNote::noteWithDictionary(wrong)) << key;
  }
  auto relative = kept;
  relative.set("sources", lumora::Array{lumora::Dictionary{
                              {"recorder", "R"}, {"name", ""}, {"file", "a.mov"}, {"submission_uuid", ""}}});
  EXPECT_FALSE(LMRRecordingNote::noteWithDictionary(relative));
  relative.set("port", 65536);
  EXPECT_FALSE(LMRRecordingNote::noteWithDictionary(relative));
}

} // namespace
