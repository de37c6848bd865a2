#include "RemoteRecorderTest.h"
#include "support/MainLoop.h"

#include <thread>

namespace {

using lumora::fakes::ToolReply;
using testing::ElementsAre;
using testing::IsEmpty;

class RemoteOutcome : public RemoteRecorderTest {
protected:
  RemoteOutcome() { recorder_->setWorkflow("single-video"); }

  void expectFailure(const std::string& selector) {
    ASSERT_THAT(delegate_->selectors(), ElementsAre(selector));
    const auto error = delegate_->messages()[0].error;
    ASSERT_NE(error, nullptr);
    EXPECT_EQ(error->domain(), "org.vantor.Lumora");
    EXPECT_EQ(error->code(), 36);
    EXPECT_EQ(error->userInfo().string("stderr"), "The camera is busy");
  }

  void failEverything() { platform_.toolRunner->setDefaultReply(ToolReply::failure(36, "The camera is busy")); }
};

TEST_F(RemoteOutcome, isRemote_forBothClasses) {
  EXPECT_TRUE(recorder_->isRemote());
  EXPECT_TRUE(make<LMRRemoteAudioRecorder>()->isRemote());
}

TEST_F(RemoteOutcome, aNewRecorderHasItsNameAndSessionAndEmptyMetadata) {
  EXPECT_EQ(recorder_->remoteRecorderName(), "Studio A");
  EXPECT_EQ(recorder_->session(), session_);
  EXPECT_EQ(recorder_->metadata(), lumora::Dictionary());
  EXPECT_EQ(recorder_->workflow(), "single-video");
  EXPECT_EQ(recorder_->submissionUUID(), std::nullopt);
  EXPECT_EQ(recorder_->delayBeforeRecording(), 0U);
  EXPECT_EQ(recorder_->className(), "LMRRemoteVideoRecorder");
  EXPECT_EQ(make<LMRRemoteAudioRecorder>()->className(), "LMRRemoteAudioRecorder");
}

TEST_F(RemoteOutcome, isKnownAndToldWhenTheRequestReturns_throughAWholeRecording) {
  recorder_->start();
  EXPECT_TRUE(recorder_->isRecording());
  recorder_->pause();
  EXPECT_TRUE(recorder_->isPaused());
  recorder_->resume();
  EXPECT_TRUE(recorder_->isRecording());
  recorder_->stop();
  EXPECT_FALSE(recorder_->isRecording());
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:", "recorderDidPauseRecording:",
                                                  "recorderDidResumeRecording:", "recorderDidStopRecording:"));
}

TEST_F(RemoteOutcome, isStartingWhileTheServerStarts_andSetsNoFlagForAnyOtherRequest) {
  std::vector<bool> starting;
  platform_.toolRunner->setHandler([&](const auto&) {
    starting.push_back(recorder_->isStarting());
    return std::nullopt;
  });
  recorder_->start();
  recorder_->pause();
  recorder_->resume();
  recorder_->stop();
  EXPECT_THAT(starting, ElementsAre(true, false, false, false));
}

TEST_F(RemoteOutcome, isCancelled_whenTheServerThrewTheRecordingAway) {
  recorder_->start();
  recorder_->cancel();
  EXPECT_TRUE(recorder_->isCancelled());
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:", "recorderDidCancelRecording:"));
}

TEST_F(RemoteOutcome, isIdleAgain_whenTheStartFails) {
  failEverything();
  recorder_->start();
  expectFailure("recorderFailedToStartRecording:error:");
  EXPECT_FALSE(recorder_->isStarting());
  EXPECT_FALSE(recorder_->isRecording());
}

TEST_F(RemoteOutcome, handsOnTheErrorOfAFailedPause) {
  failEverything();
  recorder_->pause();
  expectFailure("recorderFailedToPauseRecording:error:");
}

TEST_F(RemoteOutcome, handsOnTheErrorOfAFailedResume) {
  failEverything();
  recorder_->resume();
  expectFailure("recorderFailedToResumeRecording:error:");
}

TEST_F(RemoteOutcome, handsOnTheErrorOfAFailedStop) {
  failEverything();
  recorder_->stop();
  expectFailure("recorderFailedToStopRecording:error:");
}

TEST_F(RemoteOutcome, handsOnTheErrorOfAFailedCancel) {
  failEverything();
  recorder_->cancel();
  expectFailure("recorderFailedToCancelRecording:error:");
  EXPECT_FALSE(recorder_->isCancelled());
}

TEST_F(RemoteOutcome, isNotTriedAgain_whenTheCommandFails) {
  failEverything();
  recorder_->start();
  EXPECT_EQ(platform_.toolRunner->requestCount(), 1U);
}

TEST_F(RemoteOutcome, logsNothingOfItsOwn) {
  recorder_->start();
  EXPECT_THAT(platform_.log->lines(), ElementsAre("LMRRemoteVideoRecorder successfully started recording"));
}

TEST_F(RemoteOutcome, isToldOnTheMainThreadWhileTheCallerWaits_whenRequestedOnAnother) {
  bool wasTold = false;
  std::atomic<bool> hasEnded = false;
  std::thread caller([&] {
    recorder_->start();
    wasTold = !delegate_->messages().empty();
    hasEnded = true;
  });
  EXPECT_TRUE(lumora::tests::serveUntil([&] { return hasEnded.load(); }));
  caller.join();
  EXPECT_TRUE(wasTold);
  ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:"));
  EXPECT_TRUE(delegate_->messages()[0].wasOnMainThread);
}

} // namespace
