#include "support/Boxes.h"

#include <LumoraKit/recording/LMRMovieFile.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

namespace {

using namespace lumora::tests;

// The repair cut off the type that had made it look repairable, and said that the movie was complete.
TEST(MovieFileRepair, isNotOffered_whenTheOnlyFileTypeStandsInTheTornEnd) {
  lumora::fakes::FakePlatform platform;
  const auto movie = index() + fragment(0, 800, "samples") + fragmentIndex(800, 800, 4) + fileType();
  ASSERT_EQ(platform.files->writeAtomically("/a.mov", movie), nullptr);
  const auto found = LMRMovieFile::movieFileWithPath("/a.mov");
  EXPECT_EQ(found.state, LMRMovieFile::State::Unusable);
  EXPECT_EQ(found.usableSize, 0U);
}

} // namespace
