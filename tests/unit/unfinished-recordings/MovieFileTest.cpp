#include "support/Boxes.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/recording/LMRMovieFile.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <random>

namespace {

using namespace lumora::tests;
using testing::HasSubstr;
using State = LMRMovieFile::State;

constexpr const char* path = "/movies/a.mov";

class MovieFile : public testing::Test {
protected:
  MovieFile() { platform_.files->createDirectory("/movies"); }

  LMRMovieFile look(const std::string& content) {
    EXPECT_EQ(platform_.files->writeAtomically(path, content), nullptr);
    return LMRMovieFile::movieFileWithPath(path);
  }
  void expectTornAfter(const std::string& whole, const std::string& rest) {
    const auto movie = look(whole + rest);
    EXPECT_EQ(movie.state, State::Torn);
    EXPECT_EQ(movie.usableSize, whole.size());
    EXPECT_EQ(movie.lostBytes(), rest.size());
  }

  lumora::fakes::FakePlatform platform_;
};

// Made by the recorder's own muxer: H.264 and AAC, one fragment a track and 0.8 seconds.
std::string realMovie() {
  return contentOf(LUMORA_SOURCE_DIR "/fuzz/corpus/movie-file/recording.mov");
}

TEST_F(MovieFile, isComplete_whenEveryFragmentIs) {
  const auto found = look(movie());
  EXPECT_EQ(found.state, State::Complete);
  EXPECT_TRUE(found.isPlayable());
  EXPECT_EQ(found.size, movie().size());
  EXPECT_EQ(found.usableSize, movie().size());
  EXPECT_EQ(found.lostBytes(), 0U);
  EXPECT_DOUBLE_EQ(found.duration, 1.6);
}

TEST_F(MovieFile, isComplete_withBoxesOfOtherKindsAroundItsFragments) {
  const auto found = look(fileType() + box("free", "") + index() + box("styp", "x") + fragment(0, 800, "data") +
                          box("mfra", "random access"));
  EXPECT_EQ(found.state, State::Complete);
  EXPECT_DOUBLE_EQ(found.duration, 0.8);
}

TEST_F(MovieFile, isComplete_withSizesOf64Bits) {
  const auto found =
      look(fileType() + index() + fragmentIndex(0, 500, 4) + longBox("mdat", "data") + fragment(500, 500, "more"));
  EXPECT_EQ(found.state, State::Complete);
  EXPECT_DOUBLE_EQ(found.duration, 1);
}

TEST_F(MovieFile, isComplete_whenItsLastBoxHasNoSize) {
  const auto found = look(fileType() + index() + fragmentIndex(0, 500, 4) + number(0) + "mdatdata");
  EXPECT_EQ(found.state, State::Complete);
}

TEST_F(MovieFile, takesDurationAndSizesFromTheDefaults_whenTheSamplesHaveNone) {
  EXPECT_DOUBLE_EQ(look(fileType() + index() + plainFragment(0, 3, "123451234512345")).duration, 0.03);
  const auto whole = fileType() + index() + plainFragment(0, 1, "12345");
  expectTornAfter(whole, plainFragment(10, 3, "too few bytes"));
}

TEST_F(MovieFile, isCompleteWithoutFragments_whenItIsAPlainMovie) {
  const auto header = box("moov", timeHeader("mvhd", 600, 900) + track(1, 600));
  const auto found = look(fileType() + box("mdat", "data") + header);
  EXPECT_EQ(found.state, State::Complete);
  EXPECT_DOUBLE_EQ(found.duration, 1.5);
  EXPECT_EQ(look(fileType() + header + number(100) + "mdatdata").state, State::Unusable);
}

TEST_F(MovieFile, isTornAfterItsLastWholeFragment) {
  expectTornAfter(movie(), fragment(1600, 800, "data").substr(0, 90));
  expectTornAfter(movie(), fragmentIndex(1600, 800, 4));
  expectTornAfter(movie(), fragmentIndex(1600, 800, 4) + fragment(2400, 800, "data"));
  expectTornAfter(movie(), fragmentIndex(1600, 800, 5) + box("mdat", "data"));
}

TEST_F(MovieFile, isTorn_whenZerosOrRubbishFollow) {
  expectTornAfter(movie(), std::string(4096, '\0'));
  expectTornAfter(movie(), std::string(4096, '\xFF'));
  expectTornAfter(movie(), "free");
  expectTornAfter(movie(), number(3) + "free");
  expectTornAfter(movie(), number(1) + "mdat" + number(0, 8));
  expectTornAfter(movie(), number(1) + "mdat" + number(~std::uint64_t{0}, 8));
}

TEST_F(MovieFile, isTorn_whenAFragmentIsOfNoTrackOrASecondIndexComes) {
  const auto header = box("tfhd", versionAndFlags(0) + number(7));
  expectTornAfter(movie(), box("moof", box("traf", header)) + box("mdat", ""));
  expectTornAfter(movie(), box("moof", "") + box("mdat", ""));
  expectTornAfter(movie(), index());
}

TEST_F(MovieFile, isNotKeptBusyByItsNumbers) {
  const auto header = box("tfhd", versionAndFlags(0x18) + number(1) + number(0xFFFFFFFF) + number(0xFFFFFFFF));
  const auto run = box("trun", versionAndFlags(0) + number(0xFFFFFFFF));
  expectTornAfter(movie(), box("moof", box("traf", header + run + run + run)) + box("mdat", "data"));
  std::string tracks;
  for (std::uint32_t id = 1; id < 1000; ++id) {
    tracks += track(id, 1000);
  }
  EXPECT_EQ(look(fileType() + box("moov", tracks + box("mvex", "")) + fragment(0, 800, "data")).state, State::Unusable);
  const auto promise = box("trun", versionAndFlags(0x300) + number(0xFFFFFFFF) + number(1));
  expectTornAfter(movie(), box("moof", box("traf", header + promise)) + box("mdat", "data"));
}

TEST_F(MovieFile, isUnusable_withoutTypeIndexOrOneWholeFragment) {
  for (const std::string& content :
       {std::string(), std::string("text"), std::string(5000, '\0'), fileType(), fileType() + index(),
        index() + fragment(0, 800, "data"), fileType() + fragment(0, 800, "data"),
        fileType() + index() + fragmentIndex(0, 800, 4) + number(12) + "mdatdat", fileType() + box("moov", "rubbish"),
        fileType() + box("moov", timeHeader("mvhd", 1000, 0)) + box("mdat", "")}) {
    auto found = look(content);
    EXPECT_EQ(found.state, State::Unusable);
    EXPECT_NE(found.reason, "");
    EXPECT_EQ(found.usableSize, 0U);
    EXPECT_EQ(found.lostBytes(), 0U);
    EXPECT_NE(found.repair(), nullptr);
    EXPECT_EQ(platform_.files->content(path), content);
  }
}

TEST_F(MovieFile, isMissing_whenThereIsNone) {
  auto found = LMRMovieFile::movieFileWithPath("/movies/other.mov");
  EXPECT_EQ(found.state, State::Missing);
  EXPECT_NE(found.repair(), nullptr);
}

TEST_F(MovieFile, isCutToWhatIsWhole_whenRepaired) {
  auto torn = look(movie() + "torn");
  EXPECT_EQ(torn.repair(), nullptr);
  EXPECT_EQ(torn.state, State::Complete);
  EXPECT_EQ(torn.lostBytes(), 4U);
  EXPECT_EQ(platform_.files->content(path), movie());
  EXPECT_EQ(LMRMovieFile::movieFileWithPath(path).state, State::Complete);
  EXPECT_TRUE(platform_.log->contains("The movie /movies/a.mov was cut from "));
  EXPECT_EQ(torn.repair(), nullptr);
}

TEST_F(MovieFile, staysAsItIs_whenItHasChangedSinceItWasLookedAt) {
  auto torn = look(movie() + "torn");
  platform_.files->writeAtomically(path, movie() + "and written on");
  EXPECT_NE(torn.repair(), nullptr);
  EXPECT_EQ(torn.state, State::Torn);
  EXPECT_EQ(platform_.files->content(path), movie() + "and written on");
}

TEST_F(MovieFile, isUnusableAndStaysAsItIs_whenMuchMoreIsLostThanAKillCanTear) {
  const std::string rest(LMRMovieFile::mostLostBytes, '\0');
  EXPECT_EQ(look(movie() + rest).state, State::Torn);
  auto damaged = look(movie() + rest + '\0');
  EXPECT_EQ(damaged.state, State::Unusable);
  EXPECT_THAT(damaged.reason, HasSubstr("damaged"));
  EXPECT_NE(damaged.repair(), nullptr);
  EXPECT_EQ(platform_.files->sizeOfFile(path, nullptr), movie().size() + rest.size() + 1);
}

TEST_F(MovieFile, staysTorn_whenTheDiskRefuses) {
  auto torn = look(movie() + "torn");
  platform_.files->setFailure(EROFS);
  const auto error = torn.repair();
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), EROFS);
  EXPECT_EQ(torn.state, State::Torn);
}

TEST_F(MovieFile, estimatesTheSecondsThatAreLost) {
  const auto torn = look(movie() + std::string(movie().size() / 2, '\0'));
  EXPECT_NEAR(torn.lostSeconds(), 0.8, 0.01);
}

// Wherever the writer was killed, what is left is whole fragments, and a repair is all that it ever needs.
TEST_F(MovieFile, isUsableUpToTheLastFragment_whereverARealMovieIsCut) {
  const auto whole = realMovie();
  ASSERT_GT(whole.size(), 5000U);
  ASSERT_EQ(look(whole).state, State::Complete);
  std::uint64_t usable = look(whole).usableSize;
  double duration = look(whole).duration;
  bool wasUsable = true;
  for (std::size_t size = whole.size(); size-- > 0;) {
    auto movie = look(whole.substr(0, size));
    ASSERT_LE(movie.usableSize, usable);
    ASSERT_LE(movie.duration, duration);
    ASSERT_TRUE(wasUsable || movie.state == State::Unusable);
    wasUsable = movie.state != State::Unusable;
    usable = movie.usableSize;
    duration = movie.duration;
    if (movie.state == State::Torn) {
      ASSERT_EQ(movie.repair(), nullptr);
      const auto repaired = LMRMovieFile::movieFileWithPath(path);
      ASSERT_EQ(repaired.state, State::Complete);
      ASSERT_DOUBLE_EQ(repaired.duration, duration);
    }
  }
}

TEST_F(MovieFile, isReadWithoutHarm_whateverByteOfARealMovieIsWrong) {
  const auto whole = realMovie();
  const auto seed = std::random_device()();
  SCOPED_TRACE("seed " + std::to_string(seed));
  std::mt19937 random(seed);
  for (int i = 0; i < 3000; ++i) {
    auto damaged = whole;
    for (int j = 0; j < 3; ++j) {
      // Most of the structure is in the first bytes.
      const std::size_t range = i % 2 == 0 ? 2500 : damaged.size();
      damaged[random() % std::min(range, damaged.size())] = static_cast<char>(random());
    }
    auto movie = look(damaged);
    ASSERT_LE(movie.usableSize, movie.size);
    if (movie.state == State::Torn) {
      ASSERT_EQ(movie.repair(), nullptr);
      ASSERT_EQ(LMRMovieFile::movieFileWithPath(path).state, State::Complete);
    }
  }
}

} // namespace
