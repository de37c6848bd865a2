#include "RemoteRecorderTest.h"

#include <LumoraKit/recording/LMRRecorderClasses.h>

namespace {

using lumora::Dictionary;

class RemoteArchive : public RemoteRecorderTest {
protected:
  static std::shared_ptr<lumora::Archivable> decode(const std::string& archive) {
    return lumora::KeyedUnarchiver::unarchivedObject(archive, LMRRecorderClasses());
  }
};

TEST_F(RemoteArchive, keepsTheNameAndHasNoSessionAndAZeroDelayAndEmptyMetadata_whenUnarchived) {
  recorder_->setWorkflow("single-video");
  recorder_->setSubmissionUUID("AAAA");
  recorder_->setMetadata(Dictionary{{"Title", "Lecture 1"}});
  recorder_->startWithDelay(5);
  const auto object = decode(lumora::KeyedArchiver::archivedData(*recorder_));
  const auto decoded = std::dynamic_pointer_cast<LMRRemoteVideoRecorder>(object);
  ASSERT_NE(decoded, nullptr);
  EXPECT_EQ(decoded->remoteRecorderName(), "Studio A");
  EXPECT_EQ(decoded->session(), nullptr);
  EXPECT_EQ(decoded->delayBeforeRecording(), 0U);
  EXPECT_EQ(decoded->metadata(), Dictionary());
  EXPECT_EQ(decoded->workflow(), std::nullopt);
  EXPECT_EQ(decoded->submissionUUID(), std::nullopt);
  EXPECT_FALSE(decoded->isRecording());
  EXPECT_DOUBLE_EQ(decoded->elapsedRecordingTime(), 0);
}

TEST_F(RemoteArchive, holdsTheNameAndNothingElse) {
  recorder_->startWithDelay(5);
  EXPECT_EQ(
      lumora::dictionaryWithXMLDescription(lumora::KeyedArchiver::archivedData(*recorder_)),
      (Dictionary{{"class", "LMRRemoteVideoRecorder"}, {"keys", Dictionary{{"remoteRecorderName", "Studio A"}}}}));
}

TEST_F(RemoteArchive, ofAnAudioRecorderDecodesToOne) {
  const auto object = decode(lumora::KeyedArchiver::archivedData(*make<LMRRemoteAudioRecorder>()));
  const auto decoded = std::dynamic_pointer_cast<LMRRemoteAudioRecorder>(object);
  ASSERT_NE(decoded, nullptr);
  EXPECT_EQ(decoded->remoteRecorderName(), "Studio A");
}

TEST_F(RemoteArchive, decodesWithoutAName_whenThereWasNone) {
  recorder_->setRemoteRecorderName(std::nullopt);
  const auto object = decode(lumora::KeyedArchiver::archivedData(*recorder_));
  const auto decoded = std::dynamic_pointer_cast<LMRRemoteVideoRecorder>(object);
  ASSERT_NE(decoded, nullptr);
  EXPECT_EQ(decoded->remoteRecorderName(), std::nullopt);
}

} // namespace
