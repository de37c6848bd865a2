#include "CaptureRig.h"
#include "support/Movie.h"
#include "support/TemporaryFolder.h"

#include <gmock/gmock.h>

namespace lumora::testing {
namespace {

using namespace std::chrono_literals;
using ::testing::IsEmpty;
using ::testing::Not;

class Encoders : public CaptureRig {
protected:
  void SetUp() override {
    CaptureRig::SetUp();
    if (!IsSkipped() && !Movie::canBeRead()) {
      GTEST_SKIP() << "ffmpeg is not installed";
    }
  }
  Movie recordedWith(const std::string& encoder) {
    output_->setCompressionOptions_forConnection(
        {.codec = "h264", .bitRate = {}, .width = 320, .height = 180, .encoder = encoder}, output_->connections()[0]);
    record(file(encoder + ".mov"), 300ms);
    return Movie(file(encoder + ".mov"));
  }
  /// One of the encoders writes its name into the pictures.
  bool wasMadeByX264(const std::string& encoder) const {
    return tests::contentOf(file(encoder + ".mov")).find("x264 - core") != std::string::npos;
  }
};

TEST_F(Encoders, recordWhenTheyAreChosen_eachThatIsListed) {
  const auto encoders = capture().encoders("h264");
  ASSERT_THAT(encoders, Not(IsEmpty()));
  addCameraAndMicrophone();
  run();
  for (const MediaEncoder& each : encoders) {
    EXPECT_THAT(each.name, Not(IsEmpty()));
    const Movie movie = recordedWith(each.identifier);
    EXPECT_TRUE(movie.decodes()) << each.identifier;
    EXPECT_EQ(movie.stream("v", "codec_name"), "h264") << each.identifier;
    EXPECT_EQ(wasMadeByX264(each.identifier), each.name == "x264") << each.identifier;
  }
}

TEST_F(Encoders, areListedWithTheFrameworksChoiceFirst) {
  const auto encoders = capture().encoders("h264");
  ASSERT_THAT(encoders, Not(IsEmpty()));
  EXPECT_EQ(capture().encoders("h264"), encoders);
  addCameraAndMicrophone();
  run();
  record(file("automatic.mov"), 300ms);
  EXPECT_EQ(wasMadeByX264("automatic"), encoders.front().name == "x264");
}

TEST_F(Encoders, giveWayToAnother_whenTheChosenOneIsNotThere) {
  addCameraAndMicrophone();
  run();
  const Movie movie = recordedWith("an-encoder-of-another-machine");
  EXPECT_TRUE(movie.decodes());
  EXPECT_EQ(movie.stream("v", "codec_name"), "h264");
}

TEST_F(Encoders, areNone_whenTheCodecIsUnknown) {
  EXPECT_THAT(capture().encoders("smoke-signals"), IsEmpty());
}

} // namespace
} // namespace lumora::testing
