#include "CaptureRig.h"

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRVideoPreview.h>

#include <gmock/gmock.h>

#include <set>

namespace lumora::testing {

class Preview : public CaptureRig {
protected:
  // Takes pictures until one has come.
  std::optional<Picture> look(std::uint32_t width, std::uint32_t height) {
    std::optional<Picture> picture;
    Platform::current().mainThread->serveUntil(
        [&] {
          picture = picture ? picture : preview_->takePicture(width, height);
          return picture.has_value();
        },
        std::chrono::seconds(20));
    return picture;
  }

  void openPreview() {
    LMRErrorRef error;
    preview_ = LMRVideoPreview::previewWithCaptureSession_error(session_, &error);
    ASSERT_NE(preview_, nullptr) << text(error);
  }

  static std::size_t coloursOf(const Picture& picture) {
    std::set<std::vector<std::uint8_t>> colours;
    for (std::size_t i = 0; i + 2 < picture.rgb.size(); i += 3) {
      colours.insert({picture.rgb[i], picture.rgb[i + 1], picture.rgb[i + 2]});
    }
    return colours.size();
  }

  std::unique_ptr<LMRVideoPreview> preview_;
};

// The headless camera shows colour bars of 1280 x 720.
TEST_F(Preview, showsThePictureOfTheCamera_inItsProportions) {
  addCameraAndMicrophone();
  run();
  openPreview();
  const auto picture = look(320, 320);
  ASSERT_TRUE(picture);
  EXPECT_EQ(picture->width, 320U);
  EXPECT_EQ(picture->height, 180U);
  EXPECT_EQ(picture->rgb.size(), 320U * 180 * 3);
  EXPECT_GT(coloursOf(*picture), 6U);
}

TEST_F(Preview, neverMakesAPictureLarger) {
  addCameraAndMicrophone();
  run();
  openPreview();
  const auto picture = look(4000, 4000);
  ASSERT_TRUE(picture);
  EXPECT_EQ(picture->width, 1280U);
  EXPECT_EQ(picture->height, 720U);
}

// Rows that are no multiple of four bytes.
TEST_F(Preview, hasRowsWithoutGaps) {
  addCameraAndMicrophone();
  run();
  openPreview();
  look(333, 333);
  const auto picture = look(333, 333);
  ASSERT_TRUE(picture);
  EXPECT_EQ(picture->width, 333U);
  EXPECT_EQ(picture->rgb.size(), std::size_t{333} * picture->height * 3);
  // A bar of one colour goes from the top down: the rows do not shift.
  const auto column = [&](std::size_t y) { return picture->rgb[(y * 333 + 20) * 3]; };
  EXPECT_EQ(column(10), column(60));
}

TEST_F(Preview, goesOnWhileARecordingIsMade) {
  addCameraAndMicrophone();
  run();
  openPreview();
  look(160, 90);
  record(file("take.mov"), std::chrono::milliseconds(500));
  EXPECT_TRUE(look(160, 90));
}

} // namespace lumora::testing
