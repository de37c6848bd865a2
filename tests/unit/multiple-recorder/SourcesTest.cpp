#include "MultipleRecorderTest.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalAudioRecorder.h>
#include <LumoraKit/recording/LMRRecorderClasses.h>
#include <LumoraKit/recording/LMRRemoteAudioRecorder.h>

namespace {

using lumora::Array;
using lumora::Dictionary;
using lumora::MediaType;
using testing::ElementsAre;

class Sources : public MultipleRecorderTest {
protected:
  static std::shared_ptr<LMRMultipleSourceRecorder> decoded(const std::string& archive) {
    return std::dynamic_pointer_cast<LMRMultipleSourceRecorder>(
        lumora::KeyedUnarchiver::unarchivedObject(archive, LMRRecorderClasses()));
  }
};

using SourcesDeathTest = Sources;

TEST_F(Sources, haveTheRecorderAsTheirDelegateAndTheirOwnOrder) {
  const auto local = LocalRecorder::make();
  const auto remote = RemoteRecorder::make("Studio A");
  const auto recorder = recorderOf({local, remote});
  EXPECT_EQ(local->delegate(), recorder);
  EXPECT_EQ(remote->delegate(), recorder);
  EXPECT_THAT(recorder->sourceRecorders(), ElementsAre(local, remote));
  EXPECT_THAT(recorder->sourceRecorderSubmissionOrder(), ElementsAre(0U, 1U));
  EXPECT_EQ(recorder->metadata(), std::nullopt);
  EXPECT_EQ(recorder->className(), "LMRMultipleSourceRecorder");
}

TEST_F(Sources, areOfAnyKind_andTheRecorderIsRemote) {
  EXPECT_TRUE(recorderOf({LocalRecorder::make()})->isRemote());
  EXPECT_TRUE(recorderOf({})->isRemote());
}

TEST_F(Sources, haveEveryValueForEveryKeyAndAreNotMixed_whenThereAreNone) {
  const auto recorder = recorderOf({});
  EXPECT_TRUE(recorder->sourceRecordersHaveValue_forKey(true, "isRecording"));
  EXPECT_TRUE(recorder->sourceRecordersHaveValue_forKey(false, "isRecording"));
  EXPECT_TRUE(recorder->sourceRecordersHaveValue_forKey(true, "no such key"));
  recorder->startWithDelay(5);
  EXPECT_TRUE(recorder->isStarting());
  EXPECT_EQ(queues_->pending(), 0U);
}

TEST_F(Sources, haveAValue_whenEveryOneHasIt) {
  const auto local = LocalRecorder::make();
  const auto remote = RemoteRecorder::make("Studio A");
  const auto recorder = recorderOf({local, remote});
  EXPECT_FALSE(recorder->sourceRecordersHaveValue_forKey(true, "isRemote"));
  EXPECT_FALSE(recorder->sourceRecordersHaveValue_forKey(false, "isRemote"));
  local->setIsPaused(true);
  EXPECT_FALSE(recorder->sourceRecordersHaveValue_forKey(true, "isPaused"));
  remote->setIsPaused(true);
  EXPECT_TRUE(recorder->sourceRecordersHaveValue_forKey(true, "isPaused"));
  EXPECT_TRUE(recorder->sourceRecordersHaveValue_forKey(false, "isRecording"));
  EXPECT_TRUE(recorder->sourceRecordersHaveValue_forKey(false, "isStarting"));
  EXPECT_TRUE(recorder->sourceRecordersHaveValue_forKey(false, "isCancelled"));
}

TEST_F(SourcesDeathTest, refuseAKeyThatIsNoState) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  const auto recorder = recorderOf({LocalRecorder::make()});
  EXPECT_DEATH(recorder->sourceRecordersHaveValue_forKey(true, "isBroken"), "sourceRecordersHaveValue:forKey:");
}

TEST_F(Sources, areTheirOwnersAndNotToldAnything_whenTheRecorderDied) {
  const auto local = LocalRecorder::make();
  recorderOf({local}).reset();
  EXPECT_EQ(local->delegate(), nullptr);
  local->didStartRecording();
  EXPECT_TRUE(told().empty());
}

TEST_F(Sources, areArchivedAndNothingElse) {
  const auto recorder = recorderOf(
      {LMRRemoteAudioRecorder::recorderWithRemoteRecorderName_session("Studio A", nullptr), UnknownRecorder::make()});
  recorder->setMetadata(Dictionary{{"Title", "Lecture 1"}});
  const Dictionary remote{{"class", "LMRRemoteAudioRecorder"},
                          {"keys", Dictionary{{"remoteRecorderName", "Studio A"}}}};
  EXPECT_EQ(lumora::dictionaryWithXMLDescription(lumora::KeyedArchiver::archivedData(*recorder)),
            (Dictionary{{"class", "LMRMultipleSourceRecorder"},
                        {"keys", Dictionary{{"sourceRecorders", Array(1, lumora::Value(remote))}}}}));
}

TEST_F(Sources, areDecodedInTheirOrderWithTheRecorderAsTheirDelegate) {
  platform_.mediaCapture->addDevice("camera", {MediaType::Muxed});
  const auto camera = platform_.mediaCapture->deviceWithUniqueID("camera");
  LMRErrorRef error;
  const auto recorder = recorderOf(
      {LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session("Studio A", lumora::tests::passwordSession()),
       LMRLocalVideoRecorder::recorderWithCaptureSession(
           LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(camera, camera, &error))});
  recorder->setSourceRecorderSubmissionOrder({1, 0});
  recorder->didStartRecording();
  const auto copy = decoded(lumora::KeyedArchiver::archivedData(*recorder));
  ASSERT_NE(copy, nullptr);
  const auto sources = copy->sourceRecorders();
  ASSERT_EQ(sources.size(), 2U);
  EXPECT_EQ(sources[0]->className(), "LMRRemoteVideoRecorder");
  EXPECT_EQ(sources[1]->className(), "LMRLocalVideoRecorder");
  EXPECT_EQ(sources[0]->delegate(), copy);
  EXPECT_EQ(sources[1]->delegate(), copy);
  EXPECT_THAT(copy->sourceRecorderSubmissionOrder(), ElementsAre(0U, 1U));
  EXPECT_EQ(copy->workflowUUID(), std::nullopt);
  EXPECT_EQ(copy->session(), nullptr);
  EXPECT_EQ(copy->metadata(), std::nullopt);
  EXPECT_FALSE(copy->isRecording());
}

TEST_F(Sources, areDecodedWithoutThoseThatCannotBe) {
  platform_.mediaCapture->addDevice("microphone", {MediaType::Sound});
  LMRErrorRef error;
  const auto recorder =
      recorderOf({LMRLocalAudioRecorder::recorderWithCaptureSession(
                      LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(
                          platform_.mediaCapture->deviceWithUniqueID("microphone"), &error)),
                  LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session("Studio A", nullptr)});
  const auto copy = decoded(lumora::KeyedArchiver::archivedData(*recorder));
  ASSERT_NE(copy, nullptr);
  EXPECT_EQ(copy->sourceRecorders().size(), 1U);
  EXPECT_THAT(copy->sourceRecorderSubmissionOrder(), ElementsAre(0U));
}

} // namespace
