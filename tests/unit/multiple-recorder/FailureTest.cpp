#include "MultipleRecorderTest.h"

namespace {

using testing::ElementsAre;
using Report = void (LMRSourceRecorder::*)(const LMRErrorRef&);

struct Failure {
  Report report;
  std::string selector;
};

class SourceFailure : public MultipleRecorderTest, public testing::WithParamInterface<Failure> {};

TEST_P(SourceFailure, isReportedOnceAsTheSameKind_andLaterMessagesOfTheOtherSourcesHaveNoEffect) {
  const auto local = LocalRecorder::make();
  const auto remote = RemoteRecorder::make("Studio A");
  const auto recorder = recorderOf({local, remote});
  const auto error = LMRError::make("platform", 7, "Unplugged");
  bool wasDetached = false;
  delegate_->onMessage = [&](const auto&) { wasDetached = !local->delegate() && !remote->delegate(); };
  ((*remote).*GetParam().report)(error);
  EXPECT_TRUE(wasDetached);
  ((*local).*GetParam().report)(LMRError::make("platform", 8, "Unplugged as well"));
  local->didStartRecording();
  remote->didStartRecording();
  local->didStopRecording();
  remote->didStopRecording();
  ASSERT_THAT(told(), ElementsAre(GetParam().selector));
  EXPECT_EQ(delegate_->messages()[0].error, error);
  EXPECT_EQ(delegate_->messages()[0].recorder, recorder.get());
}

TEST_P(SourceFailure, withoutAnErrorIsReportedWithoutOne) {
  const auto local = LocalRecorder::make();
  const auto recorder = recorderOf({local});
  ((*local).*GetParam().report)(nullptr);
  ASSERT_THAT(told(), ElementsAre(GetParam().selector));
  EXPECT_EQ(delegate_->messages()[0].error, nullptr);
}

INSTANTIATE_TEST_SUITE_P(
    OfEachKind, SourceFailure,
    testing::Values(
        Failure{&LMRSourceRecorder::failedToStartRecordingWithError, "recorderFailedToStartRecording:error:"},
        Failure{&LMRSourceRecorder::failedToPauseRecordingWithError, "recorderFailedToPauseRecording:error:"},
        Failure{&LMRSourceRecorder::failedToResumeRecordingWithError, "recorderFailedToResumeRecording:error:"},
        Failure{&LMRSourceRecorder::failedToStopRecordingWithError, "recorderFailedToStopRecording:error:"},
        Failure{&LMRSourceRecorder::failedToCancelRecordingWithError, "recorderFailedToCancelRecording:error:"}),
    [](const auto& instance) {
      const std::string selector = instance.param.selector;
      return selector.substr(0, selector.find(':'));
    });

} // namespace
