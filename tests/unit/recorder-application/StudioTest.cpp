#include "recorder/model/Studio.h"

#include "Workflows.h"
#include "support/Sessions.h"

#include <LumoraKit/testing/FakeCaptureErrors.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>

namespace recorder {
namespace {

using lumora::MediaType;
using lumora::fakes::ToolReply;
using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::Not;
using ::testing::SizeIs;
using ::testing::UnorderedElementsAre;

constexpr lumora::HostTime second = 1'000'000'000;

/// The recorder on fakes: a camera, a microphone, a screen and a server.
class StudioTest : public ::testing::Test {
protected:
  StudioTest() {
    auto platform = lumora::Platform::current();
    platform.queues = queues_;
    platform.mainThread = queues_->mainThread();
    lumora::Platform::install(platform);
    platform_.mediaCapture->setHostTime(second);
    platform_.mediaCapture->addDevice("camera", {MediaType::Video});
    platform_.mediaCapture->addDevice("microphone", {MediaType::Sound});
    platform_.toolRunner->reply("listworkflows", ToolReply::success({{"workflows", descriptions()}}));
    platform_.toolRunner->reply(
        "create_recording",
        ToolReply::success({{"recording_uuid", "R"}, {"submission_uuids", lumora::Array{"S1", "S2"}}}));
  }

  void begin(const std::string& workflow = "camera") {
    studio_ = Studio::make();
    studio_->begin();
    studio_->setSession(lumora::tests::passwordSession());
    queues_->runAll();
    studio_->selectWorkflow(workflow);
    queues_->runAll();
  }
  /// Samples reach every output, and what comes of them is told.
  void pass(double seconds) {
    platform_.mediaCapture->advanceHostTime(static_cast<lumora::HostTime>(seconds * second));
    platform_.wallClock->advance(std::chrono::milliseconds(static_cast<int>(seconds * 1000)));
    for (int round = 0; round < 4; ++round) {
      queues_->runAll();
      for (const auto& output : platform_.mediaCapture->movieFileOutputs()) {
        output->emitSample(MediaType::Video, platform_.mediaCapture->advanceHostTime(1));
        output->emitSample(MediaType::Sound, platform_.mediaCapture->hostTime());
        output->deliverOutcomes();
      }
    }
    queues_->runAll();
  }
  void record() {
    studio_->record();
    pass(0.1);
    ASSERT_EQ(state(), TakeState::Recording);
  }
  void lookAtDevices() {
    platform_.mediaCapture->advanceHostTime(3 * second);
    studio_->tick(std::nullopt);
    queues_->runAll();
  }
  TakeState state() const { return studio_->take()->state(); }
  std::vector<std::string> submittedNames() const {
    std::vector<std::string> all;
    for (const LMRSubmission& submission : studio_->submissions().submitted()) {
      all.push_back(submission.name);
    }
    return all;
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::fakes::ManualQueues> queues_ = std::make_shared<lumora::fakes::ManualQueues>();
  std::shared_ptr<Studio> studio_;
};

TEST_F(StudioTest, canRecord_whenSourcesAreOpen) {
  begin();
  ASSERT_THAT(studio_->sources(), SizeIs(1));
  EXPECT_EQ(studio_->sources()[0]->state(), SourceState::Ready);
  EXPECT_TRUE(studio_->sources()[0]->hasSound());
  EXPECT_TRUE(studio_->canRecord());
  EXPECT_TRUE(studio_->roomLeft());
}

TEST_F(StudioTest, recordsPausesAndSubmits) {
  begin();
  studio_->setEpisode({"Waves", "About waves"});
  record();
  pass(2);
  EXPECT_NEAR(studio_->take()->elapsedTime(), 2, 0.2);
  studio_->take()->pause();
  pass(0.1);
  EXPECT_EQ(state(), TakeState::Paused);
  EXPECT_EQ(studio_->sources()[0]->state(), SourceState::Paused);
  studio_->take()->resume();
  pass(0.1);
  EXPECT_EQ(state(), TakeState::Recording);
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_THAT(platform_.toolRunner->commands(), Contains("submit"));
  EXPECT_THAT(studio_->submissions().submitted(), SizeIs(1));
  EXPECT_TRUE(studio_->canRecord());
  EXPECT_EQ(studio_->notice(), "");
}

TEST_F(StudioTest, canRecordAgain_withTheSameSession) {
  begin();
  const auto sessions = platform_.mediaCapture->sessions().size();
  for (int take = 0; take < 2; ++take) {
    record();
    studio_->take()->stop(studio_->episode());
    pass(0.1);
  }
  EXPECT_THAT(studio_->submissions().submitted(), SizeIs(2));
  EXPECT_EQ(platform_.mediaCapture->sessions().size(), sessions);
}

TEST_F(StudioTest, recordsTwoSources) {
  begin("both");
  record();
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_THAT(submittedNames(), UnorderedElementsAre("camera", "Screen"));
}

TEST_F(StudioTest, numbersTheSources_whoseNamesAreTheSame) {
  platform_.toolRunner->reply(
      "listworkflows", ToolReply::success({{"workflows", lumora::Array{description("two", {{"Video"}, {"Video"}})}}}));
  platform_.mediaCapture->addDevice("camera 2", {MediaType::Video})->setLocalizedDisplayName("camera");
  begin("two");
  record();
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_THAT(submittedNames(), UnorderedElementsAre("Source 1", "Source 2"));
}

TEST_F(StudioTest, givesNoNameToTheOnlySource) {
  begin();
  record();
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_THAT(submittedNames(), ElementsAre(""));
}

TEST_F(StudioTest, recordsAMicrophone) {
  begin("sound");
  record();
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_THAT(studio_->submissions().submitted(), SizeIs(1));
}

TEST_F(StudioTest, recordsACameraOfTheServer_withTheScreen) {
  platform_.mediaCapture->loseDevice("camera");
  platform_.toolRunner->reply(
      "listcameras", ToolReply::success({{"cameras", lumora::Array{lumora::Dictionary{{"name", "Studio A"}}}}}));
  begin("both");
  ASSERT_THAT(studio_->sources(), SizeIs(2));
  EXPECT_EQ(studio_->sources()[0]->plan().source.kind, SourceKind::RemoteCamera);
  record();
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_THAT(studio_->submissions().submitted(), SizeIs(1));
  EXPECT_TRUE(studio_->canRecord());
}

TEST_F(StudioTest, removesTheFile_whenTheRecordingIsDiscarded) {
  begin();
  record();
  const auto file =
      std::dynamic_pointer_cast<LMRLocalVideoRecorder>(studio_->sources()[0]->recorder())->outputFileURL();
  EXPECT_TRUE(platform_.files->isFile(*file));
  studio_->take()->cancel();
  pass(0.1);
  EXPECT_FALSE(platform_.files->isFile(*file));
  EXPECT_THAT(platform_.toolRunner->commands(), Not(Contains("submit")));
  EXPECT_TRUE(studio_->canRecord());
}

TEST_F(StudioTest, goesOn_whenTheServerHasNoPlaceForTheRecording) {
  begin();
  record();
  platform_.toolRunner->replyOnce("create_recording", ToolReply::failure(20));
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_EQ(state(), TakeState::Recording);
  EXPECT_TRUE(studio_->take()->hasNoPlaceAtServer());
  EXPECT_THAT(studio_->notice(), HasSubstr("goes on"));
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_THAT(studio_->submissions().submitted(), SizeIs(1));
}

TEST_F(StudioTest, keepsTheFile_whenItIsStoppedWithoutAServer) {
  begin();
  record();
  const auto file =
      std::dynamic_pointer_cast<LMRLocalVideoRecorder>(studio_->sources()[0]->recorder())->outputFileURL();
  studio_->take()->stopWithoutServer();
  pass(0.1);
  EXPECT_TRUE(platform_.files->isFile(*file));
  EXPECT_THAT(studio_->notice(), HasSubstr(file->string()));
  EXPECT_THAT(studio_->submissions().waiting(), IsEmpty());
  EXPECT_TRUE(studio_->canRecord());
}

TEST_F(StudioTest, goesOnWithTheOthers_whenASourceIsLost) {
  begin("both");
  record();
  platform_.mediaCapture->loseDevice("camera");
  pass(0.1);
  EXPECT_EQ(studio_->sources()[0]->state(), SourceState::Failed);
  EXPECT_EQ(studio_->sources()[1]->state(), SourceState::Recording);
  EXPECT_EQ(state(), TakeState::Recording);
  EXPECT_THAT(studio_->notice(), HasSubstr("lost"));
  studio_->take()->pause();
  pass(0.1);
  EXPECT_EQ(state(), TakeState::Paused);
  studio_->take()->resume();
  pass(0.1);
  EXPECT_EQ(state(), TakeState::Recording);
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  EXPECT_THAT(studio_->submissions().submitted(), SizeIs(2));
}

TEST_F(StudioTest, stopsByItself_whenEverySourceIsLost) {
  begin();
  record();
  platform_.mediaCapture->loseDevice("camera");
  pass(0.1);
  pass(0.1);
  EXPECT_FALSE(studio_->isUnderWay());
  EXPECT_THAT(studio_->submissions().submitted(), SizeIs(1));
}

TEST_F(StudioTest, discardsAlsoTheFileOfALostSource) {
  begin("both");
  record();
  platform_.mediaCapture->loseDevice("camera");
  pass(0.1);
  studio_->take()->cancel();
  pass(0.1);
  for (const auto& file : platform_.files->files()) {
    EXPECT_NE(file.extension(), ".mov") << file;
  }
}

TEST_F(StudioTest, showsALostSource_beforeTheRecording_andOpensItAgain) {
  begin();
  platform_.mediaCapture->loseDevice("camera");
  lookAtDevices();
  EXPECT_EQ(studio_->sources()[0]->state(), SourceState::Failed);
  EXPECT_FALSE(studio_->canRecord());
  platform_.mediaCapture->addDevice("camera", {MediaType::Video});
  lookAtDevices();
  EXPECT_EQ(studio_->sources()[0]->state(), SourceState::Ready);
  EXPECT_TRUE(studio_->canRecord());
}

TEST_F(StudioTest, takesACameraForLost_whenNoPictureComes) {
  begin();
  studio_->tick(Studio::PictureSize({320, 180}));
  platform_.mediaCapture->advanceHostTime(5 * second);
  studio_->tick(Studio::PictureSize({320, 180}));
  EXPECT_EQ(studio_->sources()[0]->state(), SourceState::Failed);
}

TEST_F(StudioTest, warns_whenTheMicrophoneIsSilentForTenSeconds) {
  begin();
  EXPECT_FALSE(studio_->sources()[0]->isSilent());
  platform_.mediaCapture->advanceHostTime(11 * second);
  EXPECT_TRUE(studio_->sources()[0]->isSilent());
}

TEST_F(StudioTest, tellsWhyADeviceDoesNotOpen) {
  const auto refusal = lumora::fakes::captureError(lumora::CaptureErrorCode::DeviceFailed, "The camera is busy");
  platform_.mediaCapture->failToStart(refusal);
  begin();
  EXPECT_EQ(studio_->sources()[0]->error(), refusal);
  EXPECT_FALSE(studio_->canRecord());
  platform_.mediaCapture->failToStart(nullptr);
  studio_->reopen(0);
  queues_->runAll();
  EXPECT_TRUE(studio_->canRecord());
}

TEST_F(StudioTest, keepsAFailedSubmission) {
  begin();
  platform_.toolRunner->reply("submit", ToolReply::failure(20));
  record();
  studio_->take()->stop(studio_->episode());
  queues_->runNext();
  pass(0.1);
  ASSERT_THAT(studio_->submissions().waiting(), SizeIs(1));
  const auto entry = studio_->submissions().waiting().front();
  EXPECT_TRUE(entry.lastError);
  platform_.toolRunner->reply("submit", ToolReply());
  studio_->submissions().retry(entry.identifier);
  queues_->runAll();
  EXPECT_THAT(studio_->submissions().waiting(), IsEmpty());
}

TEST_F(StudioTest, keepsItsSettings) {
  begin();
  Settings settings = studio_->settings();
  settings.folder = "/home/user/Films";
  settings.quality = Quality::High;
  settings.encoder = "some-encoder";
  platform_.files->createDirectory(*settings.folder);
  studio_->setSettings(settings);
  queues_->runAll();
  EXPECT_EQ(Settings::load(), settings);
  const auto recorder = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(studio_->sources()[0]->recorder());
  EXPECT_EQ(recorder->outputFileURL()->parent_path(), *settings.folder);
  EXPECT_EQ(recorder->videoCompressionOptions()->bitRate, 8'000'000U);
  EXPECT_EQ(recorder->videoCompressionOptions()->encoder, "some-encoder");
}

TEST_F(StudioTest, leavesTheEncoderToTheFramework_unlessOneWasChosen) {
  platform_.mediaCapture->setEncoders({{"fast", "Fast", true}, {"slow", "Slow", false}});
  begin();
  const auto compression = [&] {
    return std::dynamic_pointer_cast<LMRLocalVideoRecorder>(studio_->sources()[0]->recorder())
        ->videoCompressionOptions();
  };
  EXPECT_EQ(studio_->devices().encoders().size(), 2U);
  EXPECT_FALSE(compression());
  Settings settings = studio_->settings();
  settings.encoder = "slow";
  studio_->setSettings(settings);
  queues_->runAll();
  ASSERT_TRUE(compression());
  EXPECT_EQ(compression()->encoder, "slow");
  EXPECT_FALSE(compression()->bitRate);
}

TEST_F(StudioTest, notesATakeOnDisk_whileItIsUnderWay) {
  begin();
  record();
  EXPECT_EQ(studio_->recovery().found(), nullptr);
  const auto notes = [&] {
    const auto files = platform_.files->files();
    return std::ranges::count_if(files, [](const auto& each) { return each.parent_path().filename() == "Recordings"; });
  };
  EXPECT_GT(notes(), 0);
  studio_->take()->stop(studio_->episode());
  pass(0.1);
  const auto left = platform_.files->files();
  EXPECT_TRUE(std::ranges::none_of(left, [](const auto& each) {
    return each.parent_path().filename() == "Recordings" && each.extension() == ".plist";
  }));
}

TEST_F(StudioTest, leavesTheChoiceAlone_whileItRecords) {
  begin();
  record();
  studio_->selectWorkflow("screen");
  EXPECT_EQ(studio_->selection().workflow()->uuid, "camera");
}

} // namespace
} // namespace recorder
