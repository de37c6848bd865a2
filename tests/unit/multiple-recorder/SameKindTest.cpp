#include "MultipleRecorderTest.h"

#include <LumoraKit/platform/Queues.h>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// Keeps what is done with serial queues.
class NotingQueues : public lumora::Queues {
public:
  explicit NotingQueues(std::shared_ptr<lumora::Queues> queues) : queues_(std::move(queues)) {}

  std::shared_ptr<lumora::WorkQueue> makeSerialQueue(std::string label) override {
    notes.push_back("make " + label);
    return std::make_shared<Queue>(queues_->makeSerialQueue(std::move(label)), notes);
  }
  std::shared_ptr<lumora::WorkQueue> concurrentQueue() override { return queues_->concurrentQueue(); }
  std::shared_ptr<lumora::WorkQueue> highPriorityQueue() override { return queues_->highPriorityQueue(); }
  std::shared_ptr<lumora::WorkQueue> mainQueue() override { return queues_->mainQueue(); }
  std::shared_ptr<lumora::WorkQueue> currentQueue() override { return queues_->currentQueue(); }
  void runAfter(std::chrono::nanoseconds delay, std::shared_ptr<lumora::WorkQueue> queue, lumora::Task task) override {
    queues_->runAfter(delay, std::move(queue), std::move(task));
  }

  std::vector<std::string> notes;

private:
  class Queue : public lumora::WorkQueue {
  public:
    Queue(std::shared_ptr<lumora::WorkQueue> queue, std::vector<std::string>& notes)
        : queue_(std::move(queue)), notes_(notes) {}
    ~Queue() override { notes_.emplace_back("release"); }
    const std::string& label() const override { return queue_->label(); }
    void async(lumora::Task task) override {
      notes_.emplace_back("submit");
      queue_->async(std::move(task));
    }

  private:
    const std::shared_ptr<lumora::WorkQueue> queue_;
    std::vector<std::string>& notes_;
  };

  const std::shared_ptr<lumora::Queues> queues_;
};

class SameKind : public MultipleRecorderTest {
protected:
  std::shared_ptr<LocalRecorder> first_ = LocalRecorder::make();
  std::shared_ptr<LocalRecorder> second_ = LocalRecorder::make();
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_ = recorderOf({first_, second_});
};

TEST_F(SameKind, startSubmitsEveryStartToItsOwnQueueAtOnce_andTellsTheStartOnceAfterTheLastSourceRecords) {
  recorder_->startWithDelay(5);
  EXPECT_TRUE(recorder_->isStarting());
  EXPECT_EQ(queues_->pending(), 2U);
  EXPECT_THAT(first_->requests(), IsEmpty());
  queues_->runAll();
  EXPECT_THAT(first_->requests(), ElementsAre("start 5"));
  EXPECT_THAT(second_->requests(), ElementsAre("start 5"));
  second_->didStartRecording();
  EXPECT_THAT(told(), IsEmpty());
  EXPECT_FALSE(recorder_->isRecording());
  first_->didStartRecording();
  EXPECT_THAT(told(), ElementsAre("recorderDidStartRecording:"));
  EXPECT_TRUE(recorder_->isRecording());
  EXPECT_FALSE(recorder_->isStarting());
  EXPECT_EQ(delegate_->messages()[0].recorder, recorder_.get());
}

TEST_F(SameKind, makesEveryQueueBeforeItSubmitsAnything_andReleasesThemAtOnce) {
  const auto noting = std::make_shared<NotingQueues>(queues_);
  auto platform = lumora::Platform::current();
  platform.queues = noting;
  lumora::Platform::install(platform);
  recorder_->pause();
  const std::string make = "make org.vantor.LumoraRecorder.recording";
  EXPECT_THAT(noting->notes, ElementsAre(make, make, "submit", "submit", "release", "release"));
  noting->notes.clear();
  recorder_->cancel();
  EXPECT_THAT(noting->notes, ElementsAre(make, make, "submit", "submit", "release", "release"));
}

TEST_F(SameKind, aTaskKeepsItsSourceAlive_whenTheRecorderIsDropped) {
  recorder_->start();
  recorder_.reset();
  const std::weak_ptr<LocalRecorder> source = first_;
  first_.reset();
  EXPECT_FALSE(source.expired());
  queues_->runAll();
  EXPECT_TRUE(source.expired());
}

TEST_F(SameKind, pauseAndResumeAreToldAfterTheLastSource) {
  recorder_->start();
  queues_->runAll();
  first_->didStartRecording();
  second_->didStartRecording();
  recorder_->pause();
  queues_->runAll();
  first_->didPauseRecording();
  EXPECT_FALSE(recorder_->isPaused());
  second_->didPauseRecording();
  EXPECT_TRUE(recorder_->isPaused());
  recorder_->resume();
  queues_->runAll();
  first_->didResumeRecording();
  EXPECT_TRUE(recorder_->isPaused());
  second_->didResumeRecording();
  EXPECT_TRUE(recorder_->isRecording());
  EXPECT_THAT(told(),
              ElementsAre("recorderDidStartRecording:", "recorderDidPauseRecording:", "recorderDidResumeRecording:"));
  EXPECT_THAT(first_->requests(), ElementsAre("start 0", "pause", "resume"));
}

TEST_F(SameKind, resumeIsTold_whenNoSourceIsPausedAlthoughOneDoesNotRecord) {
  recorder_->setIsPaused(true);
  second_->setIsRecording(false);
  first_->didResumeRecording();
  EXPECT_THAT(told(), ElementsAre("recorderDidResumeRecording:"));
}

TEST_F(SameKind, resumeIsNotTold_whenTheRecorderIsNotPaused) {
  first_->didResumeRecording();
  second_->didResumeRecording();
  EXPECT_THAT(told(), IsEmpty());
}

TEST_F(SameKind, cancelIsToldAfterTheLastSource) {
  recorder_->cancel();
  queues_->runAll();
  first_->didCancelRecording();
  EXPECT_THAT(told(), IsEmpty());
  second_->didCancelRecording();
  EXPECT_THAT(told(), ElementsAre("recorderDidCancelRecording:"));
  EXPECT_TRUE(recorder_->isCancelled());
}

TEST_F(SameKind, bootstrapGoesToEverySourceAtOnce) {
  recorder_->bootstrap();
  EXPECT_THAT(first_->requests(), ElementsAre("bootstrap"));
  EXPECT_THAT(second_->requests(), ElementsAre("bootstrap"));
  EXPECT_EQ(queues_->pending(), 0U);
}

TEST_F(SameKind, remoteSourcesStartWithTheDelayOnQueuesOfTheirOwn) {
  const auto studioA = RemoteRecorder::make("Studio A");
  const auto studioB = RemoteRecorder::make("Studio B");
  const auto recorder = recorderOf({studioA, studioB});
  recorder->startWithDelay(2.5);
  EXPECT_EQ(queues_->pending(), 2U);
  queues_->runAll();
  EXPECT_THAT(studioA->requests(), ElementsAre("start 2.5"));
  EXPECT_THAT(studioB->requests(), ElementsAre("start 2.5"));
}

} // namespace
