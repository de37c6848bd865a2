// What becomes of a recording of three sources after kill -9: it is found, repaired, and filed.
#include "Victim.h"
#include "support/ChildProgram.h"
#include "support/HeadlessDevices.h"
#include "support/MainLoop.h"
#include "support/Movie.h"
#include "support/Sandbox.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/RootedToolRunner.h>
#include <LumoraKit/recording/LMRUnfinishedRecording.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

namespace {

using lumora::testing::Movie;
using lumora::tests::ChildProgram;
using testing::IsEmpty;
using testing::SizeIs;
using Server = lumora::tests::SandboxServer;

class UnfinishedRecording : public testing::Test {
protected:
  void SetUp() override {
    std::string reason;
    devices_ = lumora::testing::HeadlessDevices::start(reason);
    if (!devices_ || !Movie::canBeRead()) {
      GTEST_SKIP() << (devices_ ? "ffprobe and ffmpeg are not installed" : reason);
    }
    server_ = std::make_unique<Server>();
    server_->administrate({"workflow", "add"},
                          {"three", "--source", "Video", "--source", "Screen", "--source", "Audio"});
    auto platform = previous_;
    platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server_->root(), platform.toolRunner);
    lumora::Platform::install(platform);
    session_->setServer(Server::host);
    session_->setPort(Server::port);
    session_->setUserName(Server::userName);
    session_->setPassword(Server::password);
    session_->setAuthenticationType(LMRAuthenticationTypePassword);
    startVictim();
  }
  void TearDown() override { lumora::Platform::install(previous_); }

  // On a very busy machine a headless camera may be late for its recorder: then another one tries.
  void startVictim() {
    constexpr int tries = 5;
    for (int i = 0; i < tries; ++i) {
      folder_ = std::make_unique<lumora::tests::TemporaryFolder>();
      victim_ = ChildProgram::startSelf({recordUntilKilledSwitch, "video:lumora_camera", folder_->path().string()});
      if (!victim_->readLine().empty()) {
        return;
      }
    }
    FAIL() << "the recording does not start";
  }

  std::vector<std::shared_ptr<LMRUnfinishedRecording>> found() const {
    return LMRUnfinishedRecording::unfinishedRecordingsInJournal(
        LMRRecordingJournal::journalWithFolder_error(*folder_ / "notes", nullptr));
  }
  std::vector<std::filesystem::path> movies() const {
    std::vector<std::filesystem::path> movies;
    for (const auto& entry : std::filesystem::directory_iterator(folder_->path())) {
      if (entry.path().extension() == ".mov") {
        movies.push_back(entry.path());
      }
    }
    return movies;
  }
  // Until each file has so many seconds of whole fragments.
  bool waitForSeconds(double seconds) const {
    return lumora::tests::serveUntil([this, seconds] {
      const auto files = movies();
      return files.size() == 3 && std::ranges::all_of(files, [seconds](const auto& file) {
               return LMRMovieFile::movieFileWithPath(file).duration >= seconds;
             });
    });
  }
  LMRErrorRef logIn(LMRUnfinishedRecording& recording) const {
    auto note = recording.note();
    note.workflowUUID = server_->workflowUUID("three");
    note.userMetadata = {{"Title", "Rescued"}};
    note.setSession(*session_);
    return recording.setNote(std::move(note));
  }
  void submit(LMRUnfinishedRecording& recording) const {
    EXPECT_EQ(logIn(recording), nullptr);
    auto error = recording.prepareSubmissionWithSession(session_);
    EXPECT_EQ(error, nullptr) << lumora::text(error);
    const auto queue = LMRSubmissionQueue::queueWithFolder_error(*folder_ / "queue", nullptr);
    error = recording.submitToQueue_session_deleteAfterSubmission(*queue, *session_, true);
    EXPECT_EQ(error, nullptr) << lumora::text(error);
    EXPECT_THAT(queue->submissions(), SizeIs(3));
    queue->setSession(session_);
    EXPECT_TRUE(lumora::tests::serveUntil([&] { return queue->submissions().empty(); }));
  }

  const lumora::Platform previous_ = lumora::Platform::current();
  std::unique_ptr<lumora::tests::TemporaryFolder> folder_;
  std::unique_ptr<lumora::testing::HeadlessDevices> devices_;
  std::unique_ptr<Server> server_;
  std::unique_ptr<ChildProgram> victim_;
  std::shared_ptr<LMRSession> session_ = LMRSession::session();
};

// By two players that have nothing in common.
void expectToPlay(const LMRMovieFile& file) {
  const Movie movie(file.file);
  EXPECT_TRUE(movie.decodes()) << file.file;
  EXPECT_NEAR(movie.duration(), file.duration, 0.1) << file.file;
  const auto player = ChildProgram::start({"gst-launch-1.0", "-q", "playbin", "uri=file://" + file.file.string(),
                                           "video-sink=fakesink", "audio-sink=fakesink"});
  ASSERT_NE(player, nullptr);
  EXPECT_TRUE(player->wait()) << file.file;
}

TEST_F(UnfinishedRecording, isFoundRepairedPlayedAndFiled_whenItsApplicationWasKilled) {
  ASSERT_TRUE(waitForSeconds(2));
  EXPECT_THAT(found(), IsEmpty()) << "it is still being recorded";
  victim_->kill();
  const auto recordings = found();
  ASSERT_THAT(recordings, SizeIs(1));
  ASSERT_THAT(recordings[0]->movies(), SizeIs(3));
  EXPECT_EQ(recordings[0]->repair(), nullptr);
  for (const LMRMovieFile& movie : recordings[0]->movies()) {
    EXPECT_TRUE(movie.isPlayable()) << movie.reason;
    EXPECT_GE(movie.duration, 2);
    expectToPlay(movie);
  }
  submit(*recordings[0]);
  const auto episodes = server_->episodes();
  EXPECT_THAT(episodes, SizeIs(3));
  for (const auto& episode : episodes) {
    EXPECT_EQ(episode.string("title"), "Rescued");
    ASSERT_TRUE(episode.string("recording_uuid"));
    EXPECT_EQ(episode.string("recording_uuid"), episodes[0].string("recording_uuid"));
  }
  EXPECT_THAT(movies(), IsEmpty());
  EXPECT_THAT(found(), IsEmpty());
}

TEST_F(UnfinishedRecording, isGoneWithItsFiles_whenDiscarded) {
  victim_->kill();
  const auto recordings = found();
  ASSERT_THAT(recordings, SizeIs(1));
  EXPECT_EQ(recordings[0]->discard(), nullptr);
  EXPECT_THAT(movies(), IsEmpty());
  EXPECT_THAT(found(), IsEmpty());
}

} // namespace
