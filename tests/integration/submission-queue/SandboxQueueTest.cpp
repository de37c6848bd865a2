#include "SandboxSession.h"
#include "Submitter.h"
#include "support/ChildProgram.h"
#include "support/MainLoop.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRReplyKeys.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/RootedToolRunner.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <iostream>
#include <random>
#include <thread>

namespace {

using lumora::tests::ChildProgram;
using testing::Each;
using testing::Field;
using testing::IsEmpty;
using testing::SizeIs;
using State = LMRSubmission::State;

class SandboxQueue : public testing::Test {
protected:
  void SetUp() override {
    auto platform = lumora::Platform::current();
    platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server_.root(), platform.toolRunner);
    lumora::Platform::install(platform);
    open();
  }
  void TearDown() override { lumora::Platform::install(previous_); }

  void open() {
    queue_.reset();
    LMRErrorRef error;
    queue_ = LMRSubmissionQueue::queueWithFolder_error(folder(), &error);
    ASSERT_NE(queue_, nullptr) << lumora::text(error);
  }

  std::filesystem::path folder() const { return server_.folder() / "queue"; }

  // One of a new recording of the server.
  std::string submissionUUID() {
    const auto action = LMRActionFactory::actionToCreateRecordingContainerForWorkflowUUID_session(
        server_.workflowUUID("single-video"), session_);
    action->runSynchronously();
    EXPECT_EQ(action->error(), nullptr) << lumora::text(action->error());
    const lumora::Array* const uuids = action->result()->array(LMRSubmissionUUIDSKey);
    return uuids && !uuids->empty() ? *uuids->front().string() : "";
  }

  void add(const std::string& uuid, bool deleteAfterSubmission = false) {
    LMRSubmission submission;
    submission.file = server_.folder() / (uuid + ".mov");
    lumora::tests::writeFile(submission.file, "movie " + uuid);
    submission.submissionUUID = uuid;
    submission.userMetadata = {{"Title", "Lecture " + uuid}};
    submission.recordingMetadata = {{"RecordingMetadata_DURATION", 5.0}};
    submission.deleteAfterSubmission = deleteAfterSubmission;
    EXPECT_EQ(queue_->add(submission, *session_), nullptr);
  }

  // Until everything was taken or is held.
  bool serveUntilSettled() {
    return lumora::Platform::current().mainThread->serveUntil(
        [this] {
          const auto left = queue_->submissions();
          return std::ranges::all_of(left, [](const auto& submission) { return submission.state == State::Held; });
        },
        lumora::tests::generousLimit);
  }

  std::vector<std::string> titles() const {
    std::vector<std::string> titles;
    for (const auto& episode : server_.episodes()) {
      titles.push_back(episode.string("title").value_or("?"));
    }
    std::ranges::sort(titles);
    return titles;
  }

  const lumora::Platform previous_ = lumora::Platform::current();
  lumora::tests::SandboxServer server_;
  std::shared_ptr<LMRSession> session_ = sandboxSession();
  std::shared_ptr<LMRSubmissionQueue> queue_;
};

TEST_F(SandboxQueue, filesWhatItHolds_andRemovesWhatIsToBeDeleted) {
  const auto kept = submissionUUID();
  const auto deleted = submissionUUID();
  add(kept);
  add(deleted, true);
  queue_->setSession(session_);
  ASSERT_TRUE(serveUntilSettled());
  EXPECT_THAT(queue_->submissions(), IsEmpty());
  EXPECT_THAT(server_.episodes(), SizeIs(2));
  EXPECT_TRUE(std::filesystem::exists(server_.folder() / (kept + ".mov")));
  EXPECT_FALSE(std::filesystem::exists(server_.folder() / (deleted + ".mov")));
}

TEST_F(SandboxQueue, holdsWhatTheServerHasAlready) {
  const auto uuid = submissionUUID();
  add(uuid);
  queue_->setSession(session_);
  ASSERT_TRUE(serveUntilSettled());
  add(uuid);
  ASSERT_TRUE(serveUntilSettled());
  ASSERT_THAT(queue_->submissions(), SizeIs(1));
  EXPECT_EQ(queue_->submissions()[0].state, State::Held);
  EXPECT_THAT(server_.episodes(), SizeIs(1));
}

// The tool survives its application, and files on.
TEST_F(SandboxQueue, losesNothingAndFilesNothingTwice_whenItsApplicationIsKilledAgainAndAgain) {
  constexpr std::size_t count = 12;
  std::vector<std::string> expected;
  for (std::size_t i = 0; i < count; ++i) {
    const auto uuid = submissionUUID();
    add(uuid, i % 2 == 0);
    expected.push_back("Lecture " + uuid);
  }
  std::ranges::sort(expected);
  queue_.reset();
  const auto seed = std::random_device()();
  std::cout << "seed " << seed << '\n';
  std::mt19937 random(seed);
  for (int kills = 0; kills < 10; ++kills) {
    const auto submitter =
        ChildProgram::startSelf({submitUntilKilledSwitch, server_.root().string(), folder().string()});
    ASSERT_EQ(submitter->readLine(), "open");
    std::this_thread::sleep_for(std::chrono::milliseconds(std::uniform_int_distribution(0, 120)(random)));
    submitter->kill();
  }
  open();
  queue_->setSession(session_);
  ASSERT_TRUE(serveUntilSettled());
  EXPECT_EQ(titles(), expected);
  // What is held was filed by a tool whose application was killed before it knew.
  EXPECT_THAT(queue_->submissions(), Each(Field(&LMRSubmission::state, State::Held)));
}

} // namespace
