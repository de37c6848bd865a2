// An application tests itself: no server, no camera, no disk, and every test is the same on every machine.

#include "LectureRecorder.h"

#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

using lumora::Array;
using lumora::MediaType;
using lumora::fakes::ToolReply;

namespace {

class LectureRecorderTest : public testing::Test {
protected:
  // A machine with a camera and a microphone, and a server that knows Ada.
  LectureRecorderTest() {
    platform_.mediaCapture->addDevice("camera", {MediaType::Video});
    platform_.mediaCapture->addDevice("microphone", {MediaType::Sound});
    platform_.toolRunner->reply("listinfo", ToolReply::success({{"server_version", "2.0"}}));
    platform_.toolRunner->reply(
        "listworkflows",
        ToolReply::success({{"workflows", Array{}}, {"user_shortname", "ada"}, {"user_fullname", "Ada Lovelace"}}));
  }

  // What the tools answer comes back through the main thread, which a test has to serve.
  bool shows(const std::string& status) {
    return lumora::Platform::current().mainThread->serveUntil([&] { return app_->status() == status; },
                                                              std::chrono::seconds(30));
  }

  void logIn() {
    app_->logIn("lumora.example.org", "ada", "apple");
    ASSERT_TRUE(shows("Logged in as Ada Lovelace")) << app_->status();
  }

  // The recording begins with a picture of the camera, as it would with a real one.
  void record() {
    app_->record();
    output().emitSample(MediaType::Video, platform_.mediaCapture->advanceHostTime(1));
    output().deliverOutcomes();
    ASSERT_EQ(app_->status(), "Recording");
  }

  lumora::fakes::FakeMovieFileOutput& output() { return *platform_.mediaCapture->movieFileOutputs().back(); }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<LectureRecorder> app_ = std::make_shared<LectureRecorder>();
};

TEST_F(LectureRecorderTest, submitsWhatItRecorded) {
  logIn();
  record();
  app_->stopAndSubmit();
  output().deliverOutcomes();
  ASSERT_TRUE(shows("Submitted")) << app_->status();
  const auto request = platform_.toolRunner->requests().back();
  EXPECT_EQ(request.command(), "submit");
  EXPECT_EQ(request.value("workflow"), "lectures");
  EXPECT_EQ(request.value("user"), "ada");
}

TEST_F(LectureRecorderTest, saysSo_whenThePasswordIsWrong) {
  platform_.toolRunner->replyOnce("listworkflows", ToolReply::failure(26, "wrong user name or password"));
  app_->logIn("lumora.example.org", "ada", "pear");
  EXPECT_TRUE(shows("Not authorized")) << app_->status();
  logIn();
}

TEST_F(LectureRecorderTest, saysSo_whenTheServerTakesNoUpload) {
  logIn();
  record();
  platform_.toolRunner->replyOnce("submit", ToolReply::failure(31));
  app_->stopAndSubmit();
  output().deliverOutcomes();
  EXPECT_TRUE(shows("Upload server is unavailable")) << app_->status();
}

TEST_F(LectureRecorderTest, keepsWhatThereIs_whenTheCameraIsLostInMidRecording) {
  logIn();
  record();
  platform_.mediaCapture->loseDevice("camera");
  output().deliverOutcomes();
  EXPECT_EQ(app_->status().find("The recording has ended: "), 0U) << app_->status();
  EXPECT_EQ(platform_.files->files().size(), 1U);
}

TEST_F(LectureRecorderTest, keepsWhatThereIs_whenTheDiskIsFull) {
  logIn();
  record();
  output().runOutOfDiskSpace();
  output().deliverOutcomes();
  EXPECT_EQ(app_->status(), "The recording has ended: No space is left for the recording");
  EXPECT_EQ(platform_.files->files().size(), 1U);
}

TEST_F(LectureRecorderTest, recordsNothing_whenThereIsNoCamera) {
  platform_.mediaCapture->loseDevice("camera");
  app_->record();
  EXPECT_TRUE(platform_.mediaCapture->movieFileOutputs().empty());
  EXPECT_NE(app_->status(), "Recording");
}

} // namespace
