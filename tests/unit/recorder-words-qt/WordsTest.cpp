#include "recorder/window/Words.h"

#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

namespace recorder {
namespace {

constexpr double minute = 60;
constexpr double hour = 60 * minute;

class Words : public testing::Test {
protected:
  lumora::fakes::FakePlatform platform_;
};

TEST_F(Words, clock_hasHoursWhenThereAreAny_andNoPartsOfASecond) {
  EXPECT_EQ(clockText(0), "0:00");
  EXPECT_EQ(clockText(7.99), "0:07");
  EXPECT_EQ(clockText(12 * minute + 34), "12:34");
  EXPECT_EQ(clockText(hour + 2 * minute + 3), "1:02:03");
  EXPECT_EQ(clockText(100 * hour), "100:00:00");
}

TEST_F(Words, span_promisesNoMoreThanThereIs) {
  EXPECT_EQ(spanText(0), "0 s");
  EXPECT_EQ(spanText(minute - 0.1), "59 s");
  EXPECT_EQ(spanText(minute), "1 min");
  EXPECT_EQ(spanText(13 * minute - 1), "12 min");
  EXPECT_EQ(spanText(3 * hour + 20 * minute + 59), "3 h 20 min");
  EXPECT_EQ(spanText(100 * hour - 1), "99 h 59 min");
  EXPECT_EQ(spanText(100 * hour), "more than 100 hours");
}

TEST_F(Words, runFromRightToLeft_inArabicOnly) {
  for (const char* const language : {"en", "de", "fr", "es", "ja"}) {
    platform_.application->setLanguage(language);
    EXPECT_EQ(textDirection(), Qt::LeftToRight) << language;
  }
  platform_.application->setLanguage("ar-EG");
  EXPECT_EQ(textDirection(), Qt::RightToLeft);
  // There are no texts in Hebrew, so the window is English.
  platform_.application->setLanguage("he");
  EXPECT_EQ(textDirection(), Qt::LeftToRight);
}

} // namespace
} // namespace recorder
