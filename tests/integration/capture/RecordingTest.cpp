#include "CaptureRig.h"
#include "support/Movie.h"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <thread>

namespace lumora::testing {

using namespace std::chrono_literals;

namespace {

double seconds(HostTime time) {
  return static_cast<double>(time) / 1e9;
}

} // namespace

class Recording : public CaptureRig {
protected:
  /// The file times of the pictures that were shown from `from` on and before `to`.
  std::vector<double> shown(HostTime from, HostTime to, double fileTimeOfFrom) const {
    std::vector<double> times;
    for (const HostTime time : delegate_->pictures()) {
      if (time >= from && time < to) {
        times.push_back(fileTimeOfFrom + seconds(time - from));
      }
    }
    return times;
  }

  static void expectTimes(const std::vector<double>& actual, const std::vector<double>& expected) {
    ASSERT_EQ(actual.size(), expected.size());
    for (std::size_t i = 0; i < actual.size(); ++i) {
      EXPECT_NEAR(actual[i], expected[i], 0.0011) << "picture " << i;
    }
  }

  /// Expects the noise at one moment of a sound to be what is at a moment of another, to within the 5 ms by which
  /// sound may be off its time stamps.
  static void expectSameSound(const std::vector<double>& first, double firstTime, const std::vector<double>& second,
                              double secondTime) {
    constexpr std::ptrdiff_t length = 2400;
    constexpr std::ptrdiff_t farthest = 480;
    const auto from = first.begin() + std::lround(firstTime * 48'000);
    const auto other = second.begin() + std::lround(secondTime * 48'000);
    ASSERT_GT(first.end() - from, length);
    ASSERT_GT(second.end() - other, length + farthest);
    std::ptrdiff_t best = farthest;
    for (std::ptrdiff_t shift = -farthest; shift <= farthest; ++shift) {
      if (likeness(from, other + shift, length) > likeness(from, other + best, length)) {
        best = shift;
      }
    }
    EXPECT_GT(likeness(from, other + best, length), 0.8);
    EXPECT_LE(std::abs(best), 240) << "frames";
  }

  using Sample = std::vector<double>::const_iterator;

  // 1 when both are the same but for their loudness.
  static double likeness(Sample one, Sample other, std::ptrdiff_t length) {
    const double product = std::inner_product(one, one + length, other, 0.0);
    const double squares = std::inner_product(one, one + length, one, 0.0);
    const double otherSquares = std::inner_product(other, other + length, other, 0.0);
    return product / std::sqrt(squares * otherSquares);
  }
};

TEST_F(Recording, firstFrameIsTheSampleThatTriggeredTheStart_whenStartedInsideItsMessage) {
  addCameraAndMicrophone();
  run();
  const HostTime start = startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  const HostTime stop = stopAtNextPicture();
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start will-finish did-finish");
  EXPECT_EQ(delegate_->lastError(), nullptr);
  const Movie movie(file("a.mov"));
  EXPECT_TRUE(movie.decodes());
  // Each picture that was shown from the start to the stop is in the file, at its own time and no other.
  expectTimes(movie.times("v"), shown(start, stop, 0));
  EXPECT_EQ(movie.stream("v", "codec_name"), "h264");
  EXPECT_EQ(movie.stream("v", "width"), "1280");
  EXPECT_EQ(movie.stream("a", "codec_name"), "aac");
  EXPECT_EQ(output_->outputFileURL(), std::nullopt);
}

TEST_F(Recording, pauseLeavesNoGapAndKeepsTheOffsetOfSound_whenResumed) {
  ASSERT_TRUE(devices_->add("noise", "noise"));
  addCameraAndMicrophone();
  run();
  // A second output records the same samples without a pause: the two files are compared.
  const auto reference = capture().makeMovieFileOutput();
  const auto referenceDelegate = std::make_shared<NotingDelegate>();
  reference->setDelegate(referenceDelegate);
  ASSERT_EQ(session_->addOutput(reference), nullptr);
  for (const auto& output : {output_, reference}) {
    output->setCompressionOptions_forConnection({"h264", {}, 320, 180}, output->connections()[0]);
    output->setCompressionOptions_forConnection({"pcm", {}, {}, {}}, output->connections()[1]);
  }
  const HostTime start = delegate_->atNext(MediaType::Video, [&](MovieFileOutput& output) {
    output.recordToOutputFileURL(file("a.mov"));
    reference->recordToOutputFileURL(file("reference.mov"));
  });
  std::this_thread::sleep_for(3s);
  const HostTime pause = pauseAtNextPicture();
  std::this_thread::sleep_for(2s);
  const HostTime resume = resumeAtNextPicture();
  std::this_thread::sleep_for(2s);
  const HostTime stop = stopAtNextPicture();
  reference->recordToOutputFileURL(std::nullopt);
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  ASSERT_TRUE(referenceDelegate->waitForEnd(file("reference.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start did-pause did-resume will-finish did-finish");

  const Movie movie(file("a.mov"));
  EXPECT_TRUE(movie.decodes());
  const double seam = seconds(pause - start);
  EXPECT_NEAR(movie.duration(), seam + seconds(stop - resume), 0.05);
  std::vector<double> expected = shown(start, pause, 0);
  const std::vector<double> second = shown(resume, stop, seam);
  expected.insert(expected.end(), second.begin(), second.end());
  expectTimes(movie.times("v"), expected);

  // The same sound, by as much later as the pictures are.
  const auto sound = movie.sound();
  const auto whole = Movie(file("reference.mov")).sound();
  expectSameSound(sound, seam - 1, whole, seam - 1);
  expectSameSound(sound, seam + 1, whole, seconds(resume - start) + 1);
}

TEST_F(Recording, writesTenFiles_whenOneSessionRecordsTenTimes) {
  addCameraAndMicrophone();
  run();
  for (int i = 0; i < 10; ++i) {
    const auto name = file(std::to_string(i) + ".mov");
    const HostTime start = startAtNextPicture(name);
    std::this_thread::sleep_for(300ms);
    const HostTime stop = stopAtNextPicture();
    ASSERT_TRUE(delegate_->waitForEnd(name));
    EXPECT_EQ(delegate_->events(name), "did-start will-finish did-finish");
    EXPECT_EQ(delegate_->lastError(), nullptr);
    EXPECT_TRUE(Movie(name).decodes());
    expectTimes(Movie(name).times("v"), shown(start, stop, 0));
  }
}

TEST_F(Recording, nextFileBeginsWhereTheFirstEnds_whenAnotherIsBegunWhileRecording) {
  addCameraAndMicrophone();
  run();
  const HostTime start = startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(500ms);
  const HostTime change = startAtNextPicture(file("b.mov"));
  EXPECT_EQ(output_->outputFileURL(), file("b.mov"));
  std::this_thread::sleep_for(500ms);
  const HostTime stop = stopAtNextPicture();
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  ASSERT_TRUE(delegate_->waitForEnd(file("b.mov")));
  expectTimes(Movie(file("a.mov")).times("v"), shown(start, change, 0));
  expectTimes(Movie(file("b.mov")).times("v"), shown(change, stop, 0));
}

TEST_F(Recording, goesOnWithItsFile_whenAskedForItAgainWhileItIsWrittenOrFinished) {
  addCameraAndMicrophone();
  run();
  const HostTime start = startAtNextPicture(file("a.mov"));
  const HostTime again = startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  startAtNextPicture(file("a.mov"));
  const HostTime stop = delegate_->atNext(MediaType::Video, [&](MovieFileOutput& output) {
    output.recordToOutputFileURL(std::nullopt);
    output.recordToOutputFileURL(file("a.mov"));
  });
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start will-finish did-finish");
  EXPECT_LT(start, again);
  EXPECT_NEAR(Movie(file("a.mov")).duration(), seconds(stop - start), 0.05);
  EXPECT_EQ(output_->outputFileURL(), std::nullopt);
}

TEST_F(Recording, countsFromTheMoments_whenRequestsNameOnesBetweenPictures) {
  addCameraAndMicrophone();
  run();
  // Each is 20 ms before the picture that it comes with.
  const auto moment = [&] { return delegate_->pictures().back() - 20'000'000; };
  HostTime start = 0;
  HostTime pause = 0;
  HostTime resume = 0;
  delegate_->atNext(MediaType::Video, [&](MovieFileOutput& output) {
    start = moment();
    output.recordToOutputFileURL_atHostTime(file("a.mov"), start);
  });
  std::this_thread::sleep_for(500ms);
  delegate_->atNext(MediaType::Video, [&](MovieFileOutput& output) {
    pause = moment();
    output.pauseRecordingAtHostTime(pause);
  });
  std::this_thread::sleep_for(200ms);
  delegate_->atNext(MediaType::Video, [&](MovieFileOutput& output) {
    resume = moment();
    output.resumeRecordingAtHostTime(resume);
  });
  std::this_thread::sleep_for(500ms);
  const HostTime stop = stopAtNextPicture();
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  std::vector<double> expected = shown(start, pause, 0);
  const std::vector<double> second = shown(resume, stop, seconds(pause - start));
  expected.insert(expected.end(), second.begin(), second.end());
  // Nothing is shown before the first picture, which therefore is shown from the beginning on.
  ASSERT_FALSE(expected.empty());
  expected.front() = 0;
  expectTimes(Movie(file("a.mov")).times("v"), expected);
}

TEST_F(Recording, finishesWithAnError_whenStoppedBeforeTheFirstSample) {
  addCameraAndMicrophone();
  ASSERT_EQ(session_->addOutput(output_), nullptr);
  output_->recordToOutputFileURL(file("a.mov"));
  EXPECT_EQ(output_->outputFileURL(), file("a.mov"));
  output_->recordToOutputFileURL(std::nullopt);
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  expectError(CaptureErrorCode::NothingRecorded);
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-finish");
  EXPECT_FALSE(std::filesystem::exists(file("a.mov")));
  ASSERT_EQ(session_->startRunning(), nullptr);
  expectGoesOn();
}

TEST_F(Recording, hasOnlyTheTracksOfEnabledConnections_whenOneIsDisabled) {
  addCameraAndMicrophone();
  session_->inputs()[1]->connections()[0]->setEnabled(false);
  run();
  record(file("a.mov"), 300ms);
  EXPECT_EQ(Movie(file("a.mov")).stream("a", "codec_name"), "");
}

TEST_F(Recording, endsATrackAndGoesOn_whenItsConnectionIsDisabledMeanwhile) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(500ms);
  session_->inputs()[1]->connections()[0]->setEnabled(false);
  std::this_thread::sleep_for(1s);
  stopAtNextPicture();
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->lastError(), nullptr);
  const Movie movie(file("a.mov"));
  EXPECT_TRUE(movie.decodes());
  EXPECT_GT(movie.times("v").back(), movie.times("a").back() + 0.5);
}

// All that came, came during a pause.
TEST_F(Recording, finishesWithAnError_whenNothingWasCapturedButDuringAPause) {
  addCameraAndMicrophone();
  run();
  delegate_->atNext(MediaType::Video, [this](MovieFileOutput& output) {
    output.recordToOutputFileURL(file("a.mov"));
    output.pauseRecording();
  });
  std::this_thread::sleep_for(2s);
  stopAtNextPicture();
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  expectError(CaptureErrorCode::NothingRecorded);
}

TEST_F(Recording, isPlayable_whenATrackHasSamplesDuringAPauseOnly) {
  addCameraAndMicrophone();
  run();
  delegate_->atNext(MediaType::Video, [this](MovieFileOutput& output) {
    output.recordToOutputFileURL(file("a.mov"));
    output.pauseRecording();
  });
  std::this_thread::sleep_for(500ms);
  session_->inputs()[1]->connections()[0]->setEnabled(false);
  resumeAtNextPicture();
  std::this_thread::sleep_for(2s);
  stopAtNextPicture();
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start did-pause did-resume will-finish did-finish");
  EXPECT_EQ(delegate_->lastError(), nullptr);
  const Movie movie(file("a.mov"));
  EXPECT_TRUE(movie.decodes());
  EXPECT_GT(movie.times("v").size(), 45U);
}

TEST_F(Recording, encodesAsWished_whenCompressionOptionsAreSet) {
  addCameraAndMicrophone();
  ASSERT_EQ(session_->addOutput(output_), nullptr);
  output_->setCompressionOptions_forConnection({"mjpeg", {}, 640, 360}, output_->connections()[0]);
  output_->setCompressionOptions_forConnection({"pcm", {}, {}, {}}, output_->connections()[1]);
  ASSERT_EQ(session_->startRunning(), nullptr);
  record(file("a.mov"), 300ms);
  const Movie movie(file("a.mov"));
  EXPECT_TRUE(movie.decodes());
  EXPECT_EQ(movie.stream("v", "codec_name"), "mjpeg");
  EXPECT_EQ(movie.stream("v", "width"), "640");
  EXPECT_EQ(movie.stream("a", "codec_name"), "pcm_s16le");
}

TEST_F(Recording, finishesWithAnError_whenTheCodecIsUnknown) {
  addCameraAndMicrophone();
  run();
  output_->setCompressionOptions_forConnection({"smoke-signals", {}, {}, {}}, output_->connections()[0]);
  startAtNextPicture(file("a.mov"));
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  expectError(CaptureErrorCode::EncoderMissing);
}

TEST_F(Recording, recordsTheScreenWithAMicrophone_whenAnXServerRuns) {
  ASSERT_EQ(session_->addInput(capture().makeScreenInput()), nullptr);
  addDevice("audio:lumora_microphone");
  run();
  record(file("a.mov"), 1s);
  const Movie movie(file("a.mov"));
  EXPECT_TRUE(movie.decodes());
  EXPECT_EQ(movie.stream("v", "height"), "720");
  EXPECT_EQ(movie.stream("a", "codec_name"), "aac");
}

TEST_F(Recording, keepsItsSizeAndShowsAllOfTheScreen_whenItsResolutionChanges) {
  ASSERT_TRUE(devices_->add("picture", "test"));
  ASSERT_EQ(session_->addInput(capture().makeScreenInput()), nullptr);
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  if (!devices_->resizeScreen(640, 480)) {
    GTEST_SKIP() << "the screen cannot be given another resolution (xrandr is not installed)";
  }
  std::this_thread::sleep_for(1s);
  stopAtNextPicture();
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->lastError(), nullptr);
  const Movie movie(file("a.mov"));
  EXPECT_TRUE(movie.decodes());
  EXPECT_EQ(movie.stream("v", "width"), "1280");
  // A screen of 4 to 3 in a picture of 16 to 9: bars at the sides.
  constexpr std::size_t beside = 80;
  constexpr std::size_t within = 320;
  const auto before = movie.middleRow(0.5);
  const auto after = movie.middleRow(movie.duration() - 0.2);
  ASSERT_EQ(before.size(), 1280U);
  ASSERT_EQ(after.size(), 1280U);
  EXPECT_GT(before[beside], 100);
  EXPECT_LT(after[beside], 30);
  EXPECT_GT(after[within], 100);
}

TEST_F(Recording, isFinished_whenTheSessionStops) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(500ms);
  session_->stopRunning();
  EXPECT_FALSE(session_->isRunning());
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->lastError(), nullptr);
  EXPECT_TRUE(Movie(file("a.mov")).decodes());
  ASSERT_EQ(session_->startRunning(), nullptr);
  expectGoesOn();
}

TEST_F(Recording, isFinished_whenTheOutputIsRemoved) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(500ms);
  session_->removeOutput(output_);
  EXPECT_TRUE(output_->connections().empty());
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_TRUE(Movie(file("a.mov")).decodes());
}

} // namespace lumora::testing
