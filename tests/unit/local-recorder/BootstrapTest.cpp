#include "LocalRecorderTest.h"

#include <LumoraKit/platform/Value.h>

namespace {

using lumora::CompressionOptions;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::MatchesRegex;

const std::string uuidMovie = "[0-9A-F]{8}-[0-9A-F]{4}-4[0-9A-F]{3}-[89AB][0-9A-F]{3}-[0-9A-F]{12}[.]mov";

class Bootstrap : public LocalRecorderTest {};
using BootstrapDeathTest = Bootstrap;

TEST_F(Bootstrap, addsTheOutputToTheSession_andWritesNothing) {
  recorder_->bootstrap();
  EXPECT_THAT(session_->outputs(), ElementsAre(recorder_->movieFileOutput()));
  EXPECT_THAT(output().requests(), IsEmpty());
  EXPECT_THAT(delegate_->selectors(), IsEmpty());
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
  EXPECT_THAT(platform_.files->files(), IsEmpty());
}

TEST_F(Bootstrap, choosesAUUIDInTheApplicationSupportFolder) {
  recorder_->bootstrap();
  EXPECT_THAT(file(), MatchesRegex("/home/user/.local/share/LumoraTest/" + uuidMovie));
  EXPECT_TRUE(platform_.files->isDirectory("/home/user/.local/share/LumoraTest"));
}

TEST_F(Bootstrap, choosesAUUIDInTheDestinationFolder_whenThePreferencesNameOne) {
  platform_.preferences->setValue("org.vantor.lumora.test", "RecorderDestinationFolder",
                                  lumora::Value("/srv/My Recordings"));
  recorder_->bootstrap();
  EXPECT_THAT(file(), MatchesRegex("/srv/My Recordings/" + uuidMovie));
  EXPECT_FALSE(platform_.files->isDirectory("/srv/My Recordings"));
}

TEST_F(Bootstrap, ignoresADestinationFolderOfAnotherApplication) {
  platform_.preferences->setValue("org.vantor.lumora.kit", "RecorderDestinationFolder", lumora::Value("/elsewhere"));
  recorder_->bootstrap();
  EXPECT_THAT(file(), MatchesRegex("/home/user/.*"));
}

TEST_F(Bootstrap, failsTheStartAndChoosesNoFile_whenTheOutputCannotBeAdded) {
  const auto error = LMRError::make("platform", 5, "No more outputs");
  fakeSession().failToAddOutput(error);
  recorder_->setIsStarting(true);
  recorder_->bootstrap();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderFailedToStartRecording:error:"));
  EXPECT_EQ(delegate_->messages()[0].error, error);
  EXPECT_EQ(recorder_->outputFileURL(), std::nullopt);
  EXPECT_FALSE(recorder_->isStarting());
}

TEST_F(Bootstrap, failsTheStart_whenThereIsNoFolder) {
  platform_.files->setApplicationSupportDirectories({});
  recorder_->bootstrap();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderFailedToStartRecording:error:"));
  EXPECT_EQ(recorder_->outputFileURL(), std::nullopt);
}

TEST_F(Bootstrap, setsTheCompressionOptionsOfEachKindOfConnection) {
  const CompressionOptions video{.codec = "h264", .bitRate = 2'000'000, .width = 640, .height = 360};
  const CompressionOptions sound{.codec = "aac", .bitRate = 96'000, .width = {}, .height = {}};
  recorder_->setVideoCompressionOptions(video);
  recorder_->setAudioCompressionOptions(sound);
  recorder_->bootstrap();
  for (const auto& connection : output().connections()) {
    EXPECT_EQ(output().compressionOptions(*connection), connection->mediaType() == MediaType::Video ? video : sound);
  }
}

TEST_F(Bootstrap, leavesTheCompressionAlone_whenThereAreNoOptions) {
  recorder_->setVideoCompressionOptions(CompressionOptions{.codec = "mjpeg", .bitRate = {}, .width = {}, .height = {}});
  recorder_->bootstrap();
  for (const auto& connection : output().connections()) {
    EXPECT_EQ(output().compressionOptions(*connection).has_value(), connection->mediaType() == MediaType::Video);
  }
}

TEST_F(BootstrapDeathTest, isRefused_whenThereIsNoSession) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  const auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(nullptr);
  EXPECT_DEATH(recorder->bootstrap(), "self.captureSession != nil, in bootstrap of LMRLocalVideoRecorder");
}

TEST_F(Bootstrap, aNewRecorderHasAnOutputAndNothingElse) {
  EXPECT_NE(recorder_->movieFileOutput(), nullptr);
  EXPECT_EQ(recorder_->captureSession(), session_);
  EXPECT_EQ(recorder_->className(), "LMRLocalVideoRecorder");
  EXPECT_EQ(recorder_->outputFileURL(), std::nullopt);
  EXPECT_EQ(recorder_->recordingStartDate(), std::nullopt);
  EXPECT_EQ(recorder_->recordingStopDate(), std::nullopt);
  EXPECT_EQ(recorder_->submissionUUID(), std::nullopt);
  EXPECT_FALSE(recorder_->isSubmitted());
  EXPECT_FALSE(recorder_->isRemote());
}

} // namespace
