#include "SampleRecorder.h"
#include "support/MainLoop.h"
#include "support/RecordingDelegate.h"

#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <thread>

namespace {

using lumora::tests::RecordingDelegate;
using lumora::tests::serveUntil;
using testing::ElementsAre;
using testing::IsEmpty;

class StopOnly : public LMRDelegateImplementation<StopOnly> {
public:
  void recorderDidStopRecording(const Recorder&) override { ++stops; }
  int stops = 0;
};

class StopAndStart : public LMRDelegateImplementation<StopAndStart, StopOnly> {
public:
  void recorderDidStartRecording(const Recorder&) override { ++starts; }
  int starts = 0;
};

class Nothing : public LMRDelegateImplementation<Nothing> {};

class Delegate : public testing::Test {
protected:
  // Reports on a worker, while the main thread does as it is told and then serves.
  void reportOnWorker(const std::function<void()>& meanwhile = [] {}) {
    std::atomic<bool> isDone = false;
    std::thread worker([&] {
      recorder_->didStopRecording();
      isDone = true;
    });
    meanwhile();
    EXPECT_TRUE(serveUntil([&] { return isDone.load(); }));
    worker.join();
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<SampleRecorder> recorder_ = std::make_shared<SampleRecorder>();
  std::shared_ptr<RecordingDelegate> delegate_ = std::make_shared<RecordingDelegate>();
};

void reportEverything(LMRSourceRecorder& recorder) {
  const auto error = LMRError::make("test", 1, "no");
  recorder.didStartRecording();
  recorder.failedToStartRecordingWithError(error);
  recorder.didPauseRecording();
  recorder.failedToPauseRecordingWithError(error);
  recorder.didResumeRecording();
  recorder.failedToResumeRecordingWithError(error);
  recorder.didStopRecording();
  recorder.failedToStopRecordingWithError(error);
  recorder.didCancelRecording();
  recorder.failedToCancelRecordingWithError(error);
}

TEST_F(Delegate, receivesThatMessageAndNothingElse_whenItImplementsOnlyDidStop) {
  const auto delegate = std::make_shared<StopOnly>();
  recorder_->setDelegate(delegate);
  reportEverything(*recorder_);
  EXPECT_EQ(delegate->stops, 1);
}

TEST_F(Delegate, respondsToWhatItImplements) {
  const StopOnly stopOnly;
  EXPECT_TRUE(stopOnly.respondsToSelector("recorderDidStopRecording:"));
  EXPECT_FALSE(stopOnly.respondsToSelector("recorderDidStartRecording:"));
  EXPECT_FALSE(stopOnly.respondsToSelector("recorderFailedToStopRecording:error:"));
  EXPECT_FALSE(stopOnly.respondsToSelector("recorderDidStopRecording"));
  EXPECT_FALSE(stopOnly.respondsToSelector(""));
  EXPECT_FALSE(Nothing().respondsToSelector("recorderDidStopRecording:"));
}

TEST_F(Delegate, respondsAlsoToWhatItsBaseImplements) {
  const auto delegate = std::make_shared<StopAndStart>();
  recorder_->setDelegate(delegate);
  reportEverything(*recorder_);
  EXPECT_EQ(delegate->stops, 1);
  EXPECT_EQ(delegate->starts, 1);
  EXPECT_FALSE(delegate->respondsToSelector("recorderDidPauseRecording:"));
}

TEST_F(Delegate, receivesAllTen_whenItImplementsThem) {
  recorder_->setDelegate(delegate_);
  reportEverything(*recorder_);
  EXPECT_THAT(delegate_->selectors(),
              ElementsAre("recorderDidStartRecording:", "recorderFailedToStartRecording:error:",
                          "recorderDidPauseRecording:", "recorderFailedToPauseRecording:error:",
                          "recorderDidResumeRecording:", "recorderFailedToResumeRecording:error:",
                          "recorderDidStopRecording:", "recorderFailedToStopRecording:error:",
                          "recorderDidCancelRecording:", "recorderFailedToCancelRecording:error:"));
}

TEST_F(Delegate, receivesAFailureWithANullError_whenItIsReportedWithoutOne) {
  recorder_->setDelegate(delegate_);
  recorder_->failedToStopRecordingWithError(nullptr);
  ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderFailedToStopRecording:error:"));
  EXPECT_EQ(delegate_->messages()[0].error, nullptr);
  EXPECT_THAT(platform_.log->lines(), ElementsAre("SampleRecorder failed to stop recording: (null)"));
}

TEST_F(Delegate, isNotOwned_andNothingIsSent_whenItDied) {
  recorder_->setDelegate(delegate_);
  delegate_.reset();
  EXPECT_EQ(recorder_->delegate(), nullptr);
  recorder_->didStopRecording();
  EXPECT_THAT(platform_.log->lines(), ElementsAre("SampleRecorder successfully stopped recording"));
}

TEST_F(Delegate, isToldOnTheMainThread_whileTheReportingThreadWaits) {
  recorder_->setDelegate(delegate_);
  std::atomic<bool> hasReturned = false;
  bool hadReturned = true;
  delegate_->onMessage = [&](const std::string&) { hadReturned = hasReturned.load(); };
  std::thread worker([&] {
    recorder_->didStopRecording();
    hasReturned = true;
  });
  EXPECT_TRUE(serveUntil([&] { return hasReturned.load(); }));
  worker.join();
  ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderDidStopRecording:"));
  EXPECT_TRUE(delegate_->messages()[0].wasOnMainThread);
  EXPECT_FALSE(hadReturned);
}

TEST_F(Delegate, isToldInsideTheCall_whenReportedOnTheMainThread) {
  recorder_->setDelegate(delegate_);
  recorder_->didPauseRecording();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidPauseRecording:"));
}

TEST_F(Delegate, mayReportAgain_insideAMessage) {
  recorder_->setDelegate(delegate_);
  delegate_->onMessage = [&](const std::string& selector) {
    if (selector == "recorderDidStartRecording:") {
      recorder_->didPauseRecording();
    }
  };
  recorder_->didStartRecording();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:", "recorderDidPauseRecording:"));
  EXPECT_TRUE(recorder_->isPaused());
}

// Says when the reporting thread has asked it.
class AskedDelegate : public RecordingDelegate {
public:
  bool respondsToSelector(std::string_view selector) const override {
    const bool responds = RecordingDelegate::respondsToSelector(selector);
    wasAsked = true;
    return responds;
  }
  void waitUntilAsked() const {
    while (!wasAsked) {
      std::this_thread::yield();
    }
  }
  mutable std::atomic<bool> wasAsked = false;
};

TEST_F(Delegate, isTheOneAtDelivery_whenItIsReplacedWhileTheMessageIsOnItsWay) {
  const auto first = std::make_shared<AskedDelegate>();
  recorder_->setDelegate(first);
  reportOnWorker([&] {
    first->waitUntilAsked();
    recorder_->setDelegate(delegate_);
  });
  EXPECT_THAT(first->selectors(), IsEmpty());
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStopRecording:"));
}

TEST_F(Delegate, isNotTold_whenItDiesWhileTheMessageIsOnItsWay) {
  static bool wasTold;
  static bool diedOnMainThread;
  wasTold = false;
  diedOnMainThread = false;
  struct MortalDelegate : AskedDelegate {
    MortalDelegate() {
      onMessage = [](const std::string&) { wasTold = true; };
    }
    ~MortalDelegate() override { diedOnMainThread = lumora::Platform::current().mainThread->isCurrent(); }
  };
  auto mortal = std::make_shared<MortalDelegate>();
  recorder_->setDelegate(mortal);
  reportOnWorker([&] {
    mortal->waitUntilAsked();
    mortal.reset();
  });
  EXPECT_FALSE(wasTold);
  EXPECT_TRUE(diedOnMainThread);
}

TEST_F(Delegate, isSentNothing_whenItDoesNotImplementTheMessageOfTheOneItReplaced) {
  const auto first = std::make_shared<AskedDelegate>();
  const auto nothing = std::make_shared<Nothing>();
  recorder_->setDelegate(first);
  reportOnWorker([&] {
    first->waitUntilAsked();
    recorder_->setDelegate(nothing);
  });
  EXPECT_THAT(first->selectors(), IsEmpty());
}

TEST_F(Delegate, isSentWhatTheDispatchArgumentsName) {
  recorder_->setDelegate(delegate_);
  const auto other = std::make_shared<SampleRecorder>();
  const auto error = LMRError::make("test", 3, "three");
  const auto arguments = [&](const std::string& selector) {
    return LMRDelegateArguments{{std::string(LMRDelegateSelector), selector},
                                {std::string(LMRDelegateRecorder), std::shared_ptr<LMRSourceRecorder>(other)}};
  };
  auto failure = arguments("recorderFailedToPauseRecording:error:");
  failure.emplace_back(LMRDelegateError, error);
  recorder_->dispatchDelegateMethodWithArguments(failure);
  recorder_->dispatchDelegateMethodWithArguments(arguments("recorderFailedToPauseRecording:error:"));
  recorder_->dispatchDelegateMethodWithArguments(arguments("recorderDidPauseRecording:"));
  recorder_->dispatchDelegateMethodWithArguments(arguments("nobodyKnowsThis:"));
  const auto messages = delegate_->messages();
  ASSERT_EQ(messages.size(), 3U);
  EXPECT_EQ(messages[0].recorder, other.get());
  EXPECT_EQ(messages[0].error, error);
  EXPECT_EQ(messages[1].error, nullptr);
  EXPECT_EQ(messages[2].selector, "recorderDidPauseRecording:");
}

TEST_F(Delegate, argumentsHaveTheirDocumentedKeys) {
  EXPECT_EQ(LMRDelegateSelector, "selector");
  EXPECT_EQ(LMRDelegateRecorder, "recorder");
  EXPECT_EQ(LMRDelegateError, "error");
}

} // namespace
