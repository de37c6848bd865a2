#include "MovieProbe.h"
#include "support/TemporaryFolder.h"

#include <gmock/gmock.h>

#include <sandbox/cameras/Movie.h>

using namespace lumora;
using namespace lumora::tests;
using testing::ElementsAre;

namespace {

struct Length {
  std::int64_t milliseconds;
  double duration;
  long frames;
  long soundSamples;
};

class Movie : public testing::Test {
protected:
  std::string write(std::int64_t milliseconds, bool hasPicture) const {
    writeFile(folder / "movie.mov", sandbox::makeMovie(milliseconds, hasPicture));
    return folder / "movie.mov";
  }
  TemporaryFolder folder;
};

class MovieLength : public Movie, public testing::WithParamInterface<Length> {};

} // namespace

TEST_P(MovieLength, isAsLongAsAskedFor) {
  LUMORA_PROBE_OR_SKIP(probe, write(GetParam().milliseconds, true));
  EXPECT_THAT(probe.codecs, ElementsAre("png", "pcm_s16le"));
  EXPECT_NEAR(probe.duration, GetParam().duration, 0.0005);
  EXPECT_THAT(probe.sampleCounts, ElementsAre(GetParam().frames, GetParam().soundSamples));
}

INSTANTIATE_TEST_SUITE_P(Lengths, MovieLength,
                         testing::Values(Length{-5, 0.1, 1, 800}, Length{0, 0.1, 1, 800}, Length{999, 0.999, 10, 7992},
                                         Length{1000, 1, 10, 8000}, Length{2350, 2.35, 24, 18'800}));

TEST_F(Movie, hasOneTrack_whenItHasNoPicture) {
  LUMORA_PROBE_OR_SKIP(probe, write(1500, false));
  EXPECT_THAT(probe.codecs, ElementsAre("pcm_s16le"));
  EXPECT_THAT(probe.sampleCounts, ElementsAre(12'000));
}

TEST_F(Movie, staysSmall_whenItIsAnHourLong) {
  EXPECT_LT(sandbox::makeMovie(3'600'000, true).size(), 500'000U);
}
