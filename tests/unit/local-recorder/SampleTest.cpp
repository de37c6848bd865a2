#include "LocalRecorderTest.h"

#include <thread>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class Sample : public LocalRecorderTest {
protected:
  Sample() { recorder_->bootstrap(); }
};

TEST_F(Sample, startsTheFileAtTheFirstSampleAfterTheRequest_whenTheDelayIsFiveSeconds) {
  recorder_->startWithDelay(5.0);
  EXPECT_TRUE(recorder_->isStarting());
  EXPECT_EQ(recorder_->hostTimeToStart(), 1000U);
  EXPECT_THAT(output().requests(), IsEmpty());
  sample(1001);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest()));
  EXPECT_EQ(recorder_->hostTimeToStart(), std::nullopt);
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("Recording new test podcast episode (by calling -recordToOutputFileURL:) at " + file()));
}

TEST_F(Sample, doesNotStart_whenItsHostTimeEqualsTheRequest_butPausesAndResumes) {
  recorder_->start();
  sample(1000);
  EXPECT_THAT(output().requests(), IsEmpty());
  sample(1001);
  capture().setHostTime(1500);
  recorder_->pause();
  EXPECT_EQ(recorder_->hostTimeToPause(), 1500U);
  sample(1499);
  sample(1500);
  EXPECT_EQ(recorder_->hostTimeToPause(), std::nullopt);
  capture().setHostTime(1600);
  recorder_->resume();
  EXPECT_EQ(recorder_->hostTimeToResume(), 1600U);
  sample(1599);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest(), "pause"));
  sample(1600);
  EXPECT_EQ(recorder_->hostTimeToResume(), std::nullopt);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest(), "pause", "resume"));
}

TEST_F(Sample, handsTheMomentOfTheRequestOn_whenItComesLater) {
  recorder_->start();
  sample(1020);
  capture().setHostTime(1500);
  recorder_->pause();
  sample(1530);
  capture().setHostTime(1600);
  recorder_->resume();
  sample(1605);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest(), "pause", "resume"));
  EXPECT_THAT(output().requestedHostTimes(), ElementsAre(1000, 1500, 1600));
}

TEST_F(Sample, startsFirstAndPausesLater_whenBothArePending) {
  recorder_->start();
  recorder_->pause();
  sample(1001);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest()));
  sample(1002);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest(), "pause"));
}

TEST_F(Sample, takesOneActionOnly_whenAllThreeArePending) {
  recorder_->resume();
  recorder_->pause();
  recorder_->start();
  for (HostTime time = 1001; time <= 1003; ++time) {
    sample(time);
    EXPECT_EQ(output().requests().size(), time - 1000);
  }
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest(), "pause", "resume"));
}

TEST_F(Sample, pausesAlthoughTheStartIsNotDueYet_whenThePauseIs) {
  recorder_->pause();
  capture().setHostTime(1100);
  recorder_->start();
  sample(1050);
  EXPECT_THAT(output().requests(), ElementsAre("pause"));
}

TEST_F(Sample, isNotRead_whenNothingIsPending) {
  const lumora::fakes::FakeSampleBuffer unread(5000);
  ASSERT_TRUE(output().emitSample(unread, output().connections()[0]));
  EXPECT_EQ(unread.reads(), 0);
  recorder_->start();
  ASSERT_TRUE(output().emitSample(unread, output().connections()[0]));
  EXPECT_EQ(unread.reads(), 1);
}

TEST_F(Sample, doesNothing_whenItHasNoHostTime) {
  recorder_->start();
  ASSERT_TRUE(output().emitSample(MediaType::Video, std::nullopt));
  EXPECT_THAT(output().requests(), IsEmpty());
  EXPECT_EQ(recorder_->hostTimeToStart(), 1000U);
}

TEST_F(Sample, startsTheFile_whateverItsConnection) {
  recorder_->start();
  ASSERT_TRUE(output().emitSample(MediaType::Sound, 1001));
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest()));
}

TEST_F(Sample, comparesUnsigned_whenHostTimesExceedTheSignedRange) {
  const HostTime late = std::numeric_limits<HostTime>::max() - 10;
  capture().setHostTime(late);
  recorder_->start();
  sample(1);
  EXPECT_THAT(output().requests(), IsEmpty());
  sample(late + 1);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest()));
}

TEST_F(Sample, takesTheLaterRequest_whenOneIsMadeTwice) {
  recorder_->start();
  capture().setHostTime(1200);
  recorder_->start();
  sample(1100);
  EXPECT_THAT(output().requests(), IsEmpty());
  sample(1201);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest()));
}

TEST_F(Sample, actsFromADevicesThread) {
  recorder_->start();
  std::thread([this] { sample(1001); }).join();
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest()));
}

TEST_F(Sample, requestsChangeNoFlag_exceptIsStarting) {
  recorder_->pause();
  recorder_->resume();
  EXPECT_FALSE(recorder_->isStarting());
  recorder_->startWithDelay(0);
  EXPECT_TRUE(recorder_->isStarting());
  EXPECT_FALSE(recorder_->isRecording());
  EXPECT_FALSE(recorder_->isPaused());
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

} // namespace
