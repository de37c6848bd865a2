#include "support/Sessions.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/ManualQueues.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <chrono>

namespace {

using namespace std::chrono_literals;
using lumora::fakes::ToolReply;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using State = LMRSubmission::State;

constexpr const char* folder = "/queue";
constexpr int noResponse = 22;
constexpr int notCompleted = 34;

class SubmissionQueue : public testing::Test {
protected:
  SubmissionQueue() {
    auto platform = lumora::Platform::current();
    platform.queues = queues_;
    platform.mainThread = queues_->mainThread();
    lumora::Platform::install(platform);
    platform_.files->createDirectory("/movies");
    changes_ = platform_.notificationCenter->observe(LMRSubmissionQueueDidChangeNotification,
                                                     [this](const std::any&) { ++changeCount_; });
    ends_ =
        platform_.notificationCenter->observe(LMRSubmissionQueueDidSubmitNotification, [this](const std::any& object) {
          submitted_.push_back(std::any_cast<const LMRSubmission&>(object).submissionUUID);
        });
    open();
  }

  void open() {
    queue_.reset();
    LMRErrorRef error;
    queue_ = LMRSubmissionQueue::queueWithFolder_error(folder, &error);
    ASSERT_NE(queue_, nullptr) << lumora::text(error);
  }

  LMRErrorRef add(const std::string& uuid, bool deleteAfterSubmission = false) {
    LMRSubmission submission;
    submission.file = "/movies/" + uuid + ".mov";
    platform_.files->writeAtomically(submission.file, "movie");
    submission.submissionUUID = uuid;
    submission.userMetadata = {{"Title", "Lecture"}};
    submission.deleteAfterSubmission = deleteAfterSubmission;
    return queue_->add(submission, *session_);
  }

  void logIn() {
    queue_->setSession(session_);
    queues_->runAll();
  }

  std::vector<std::string> filedUUIDs() const {
    std::vector<std::string> uuids;
    for (const auto& request : platform_.toolRunner->requests()) {
      uuids.push_back(request.value("submission_uuid").value_or("?"));
    }
    return uuids;
  }

  // The files of the queue's folder, the lock aside.
  std::size_t keptFiles() const {
    const auto files = platform_.files->files();
    return static_cast<std::size_t>(std::ranges::count_if(
        files, [](const auto& file) { return file.parent_path() == folder && file.extension() == ".plist"; }));
  }

  LMRSubmission only() const {
    EXPECT_THAT(queue_->submissions(), SizeIs(1));
    return queue_->submissions().empty() ? LMRSubmission() : queue_->submissions().front();
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::fakes::ManualQueues> queues_ = std::make_shared<lumora::fakes::ManualQueues>();
  std::shared_ptr<LMRSession> session_ = lumora::tests::passwordSession();
  std::shared_ptr<LMRSubmissionQueue> queue_;
  lumora::Connection changes_;
  lumora::Connection ends_;
  int changeCount_ = 0;
  std::vector<std::string> submitted_;
};

TEST_F(SubmissionQueue, keepsWhatIsAdded_untilSomebodyLogsIn) {
  EXPECT_EQ(add("A"), nullptr);
  queues_->runAll();
  EXPECT_THAT(filedUUIDs(), IsEmpty());
  EXPECT_EQ(keptFiles(), 1U);
  EXPECT_EQ(only().state, State::Waiting);
  logIn();
  EXPECT_THAT(filedUUIDs(), ElementsAre("A"));
  EXPECT_THAT(submitted_, ElementsAre("A"));
  EXPECT_THAT(queue_->submissions(), IsEmpty());
  EXPECT_EQ(keptFiles(), 0U);
}

TEST_F(SubmissionQueue, submitsOneAfterAnotherInTheOrderOfTheCalls) {
  logIn();
  add("A");
  add("B");
  add("C");
  EXPECT_EQ(queue_->submissions()[0].state, State::Submitting);
  EXPECT_EQ(queue_->submissions()[1].state, State::Waiting);
  queues_->runAll();
  EXPECT_THAT(submitted_, ElementsAre("A", "B", "C"));
}

TEST_F(SubmissionQueue, sendsTheMetadataAndLeavesNoFileOfThem) {
  logIn();
  add("A");
  queues_->runAll();
  const auto request = platform_.toolRunner->requests().at(0);
  EXPECT_TRUE(request.value("metadata"));
  EXPECT_FALSE(request.contains("recording_metadata"));
  EXPECT_FALSE(request.contains("async"));
  EXPECT_FALSE(platform_.files->content(*request.value("metadata")));
}

TEST_F(SubmissionQueue, triesAgainAfterGrowingPauses_whenTheServerDoesNotAnswer) {
  platform_.toolRunner->reply("submit", ToolReply::failure(noResponse));
  logIn();
  add("A");
  queues_->runAll();
  EXPECT_EQ(only().attempts, 1U);
  EXPECT_EQ(only().lastError, "No response from server");
  for (const auto pause : {15s, 30s, 60s, 120s, 240s, 480s, 900s, 900s}) {
    const auto before = platform_.toolRunner->requestCount();
    queues_->advance(pause - 1s);
    EXPECT_EQ(platform_.toolRunner->requestCount(), before);
    queues_->advance(1s);
    EXPECT_EQ(platform_.toolRunner->requestCount(), before + 1);
  }
  platform_.toolRunner->reply("submit", ToolReply::success({}));
  queues_->advance(900s);
  EXPECT_THAT(submitted_, ElementsAre("A"));
}

TEST_F(SubmissionQueue, goesOnWithTheNext_whenOneFails) {
  platform_.toolRunner->replyOnce("submit", ToolReply::failure(noResponse));
  logIn();
  add("A");
  add("B");
  queues_->runAll();
  EXPECT_THAT(submitted_, ElementsAre("B"));
  queues_->advance(15s);
  EXPECT_THAT(submitted_, ElementsAre("B", "A"));
}

TEST_F(SubmissionQueue, triesAtOnce_whenItIsAskedTo) {
  platform_.toolRunner->replyOnce("submit", ToolReply::failure(noResponse));
  logIn();
  add("A");
  queues_->runAll();
  queue_->retry(only().identifier);
  queues_->runAll();
  EXPECT_THAT(submitted_, ElementsAre("A"));
  queues_->advance(60s);
  EXPECT_EQ(platform_.toolRunner->requestCount(), 2U);
}

TEST_F(SubmissionQueue, holdsASubmission_thatTheServerRefusesForGood) {
  platform_.toolRunner->reply("submit", ToolReply::failure(notCompleted));
  logIn();
  add("A");
  queues_->advance(10'000s);
  EXPECT_EQ(platform_.toolRunner->requestCount(), 1U);
  EXPECT_EQ(only().state, State::Held);
  open();
  logIn();
  EXPECT_EQ(platform_.toolRunner->requestCount(), 1U);
  EXPECT_EQ(only().state, State::Held);
  EXPECT_EQ(only().lastError, "Failed to complete submission");
}

TEST_F(SubmissionQueue, survivesTheEndOfTheProcess) {
  add("A");
  add("B");
  open();
  ASSERT_THAT(queue_->submissions(), SizeIs(2));
  EXPECT_EQ(queue_->submissions()[0].userMetadata.string("Title"), "Lecture");
  logIn();
  EXPECT_THAT(submitted_, ElementsAre("A", "B"));
}

TEST_F(SubmissionQueue, submitsAgain_whenTheProcessEndedDuringATry) {
  logIn();
  add("A");
  EXPECT_EQ(only().state, State::Submitting);
  open();
  EXPECT_EQ(only().state, State::Waiting);
  EXPECT_EQ(only().attempts, 1U);
}

TEST_F(SubmissionQueue, takesAFileThatWasToBeDeletedForFiled_whenItIsGoneAfterATry) {
  platform_.toolRunner->reply("submit", ToolReply::failure(noResponse));
  logIn();
  add("A", true);
  queues_->runAll();
  platform_.files->removeFile("/movies/A.mov");
  queues_->advance(15s);
  EXPECT_THAT(submitted_, ElementsAre("A"));
  EXPECT_EQ(platform_.toolRunner->requestCount(), 1U);
}

TEST_F(SubmissionQueue, holdsASubmission_whoseFileIsGone) {
  add("A");
  platform_.files->removeFile("/movies/A.mov");
  logIn();
  EXPECT_THAT(filedUUIDs(), IsEmpty());
  EXPECT_EQ(only().state, State::Held);
  platform_.files->writeAtomically("/movies/A.mov", "back");
  queue_->retry(only().identifier);
  queues_->runAll();
  EXPECT_THAT(submitted_, ElementsAre("A"));
}

TEST_F(SubmissionQueue, leavesTheSubmissionsOfOthersAlone) {
  add("A");
  session_->setUserName("bob");
  add("B");
  logIn();
  EXPECT_THAT(submitted_, ElementsAre("B"));
  EXPECT_EQ(only().submissionUUID, "A");
}

TEST_F(SubmissionQueue, refusesWhatCannotBeKept) {
  platform_.files->setFailure(ENOSPC);
  EXPECT_NE(add("A"), nullptr);
  EXPECT_THAT(queue_->submissions(), IsEmpty());
  platform_.files->setFailure(0);
  LMRSubmission nowhere;
  nowhere.file = "/movies/A.mov";
  EXPECT_NE(queue_->add(nowhere, *session_), nullptr);
  nowhere.submissionUUID = "A";
  nowhere.file = "A.mov";
  EXPECT_NE(queue_->add(nowhere, *session_), nullptr);
  nowhere.file = "/movies/A.mov";
  nowhere.userMetadata = {{"Title", "\x01"}};
  EXPECT_NE(queue_->add(nowhere, *session_), nullptr);
  EXPECT_THAT(queue_->submissions(), IsEmpty());
}

TEST_F(SubmissionQueue, submitsOnce_whenTheDiskIsFullAfterwards) {
  logIn();
  add("A");
  platform_.files->setFailure(ENOSPC);
  queues_->advance(10'000s);
  EXPECT_EQ(platform_.toolRunner->requestCount(), 1U);
  EXPECT_EQ(only().state, State::Held);
}

TEST_F(SubmissionQueue, forgetsASubmission_unlessItIsUnderWay) {
  logIn();
  add("A");
  EXPECT_NE(queue_->remove(only().identifier), nullptr);
  EXPECT_NE(queue_->remove("nobody"), nullptr);
  platform_.toolRunner->reply("submit", ToolReply::failure(noResponse));
  queues_->runAll();
  EXPECT_EQ(queue_->remove(only().identifier), nullptr);
  EXPECT_THAT(queue_->submissions(), IsEmpty());
  EXPECT_EQ(keptFiles(), 0U);
  EXPECT_TRUE(platform_.files->content("/movies/A.mov"));
}

TEST_F(SubmissionQueue, isRefused_whileAnotherOneHasTheFolder) {
  LMRErrorRef error;
  EXPECT_EQ(LMRSubmissionQueue::queueWithFolder_error(folder, &error), nullptr);
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), EWOULDBLOCK);
  queue_.reset();
  EXPECT_NE(LMRSubmissionQueue::queueWithFolder_error(folder, nullptr), nullptr);
}

TEST_F(SubmissionQueue, leavesFilesAloneThatCannotBeRead) {
  add("A");
  platform_.files->writeAtomically("/queue/broken.plist", "<plist");
  platform_.files->writeAtomically("/queue/other.plist", *lumora::xmlDescription(lumora::Dictionary{{"file", "x"}}));
  open();
  EXPECT_EQ(only().submissionUUID, "A");
  EXPECT_EQ(keptFiles(), 3U);
  EXPECT_THAT(platform_.log->lines(), SizeIs(testing::Ge(2U)));
}

TEST_F(SubmissionQueue, tellsOfEveryChange) {
  add("A");
  EXPECT_EQ(changeCount_, 1);
  logIn();
  EXPECT_EQ(changeCount_, 3);
}

TEST_F(SubmissionQueue, mayBeLetGoOf_whileItSubmits) {
  logIn();
  add("A");
  queue_.reset();
  queues_->runAll();
  EXPECT_THAT(filedUUIDs(), ElementsAre("A"));
  EXPECT_THAT(submitted_, IsEmpty());
  EXPECT_EQ(keptFiles(), 1U);
}

// The fields of an entry on disk, each of a wrong type in turn.
class SubmissionEntry : public testing::TestWithParam<std::string> {};

TEST_P(SubmissionEntry, isRefused_whenAFieldIsMissingOrOfAWrongType) {
  LMRSubmission submission;
  submission.file = "/movies/A.mov";
  auto dictionary = submission.dictionaryRepresentation();
  EXPECT_TRUE(LMRSubmission::submissionWithDictionary(dictionary));
  dictionary.set(GetParam(), lumora::Array{});
  EXPECT_FALSE(LMRSubmission::submissionWithDictionary(dictionary));
  dictionary.remove(GetParam());
  EXPECT_FALSE(LMRSubmission::submissionWithDictionary(dictionary));
}

INSTANTIATE_TEST_SUITE_P(Each, SubmissionEntry,
                         testing::Values("identifier", "file", "submission_uuid", "user_metadata", "recording_metadata",
                                         "delete_after_submission", "server", "port", "user", "held", "attempts"));

TEST(SubmissionEntryText, keepsItsName_andNeedsNone) {
  LMRSubmission submission;
  submission.file = "/movies/A.mov";
  submission.name = "Screen";
  EXPECT_EQ(LMRSubmission::submissionWithDictionary(submission.dictionaryRepresentation())->name, "Screen");
  submission.name.clear();
  EXPECT_EQ(LMRSubmission::submissionWithDictionary(submission.dictionaryRepresentation())->name, "");
}

TEST(SubmissionEntryText, isRefused_whenANumberIsTooLarge) {
  auto dictionary = LMRSubmission().dictionaryRepresentation();
  dictionary.set("port", 65'536U);
  EXPECT_FALSE(LMRSubmission::submissionWithDictionary(dictionary));
}

} // namespace
