#include "support/CameraAndMicrophone.h"

#include <LumoraKit/recording/LMRVideoPreview.h>
#include <LumoraKit/testing/FakeCaptureDevice.h>
#include <LumoraKit/testing/FakeCaptureErrors.h>
#include <LumoraKit/testing/FakeCaptureSession.h>
#include <LumoraKit/testing/FakeMovieFileOutput.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using lumora::MediaType;
using lumora::Picture;
using testing::IsEmpty;
using testing::Optional;
using testing::SizeIs;

const Picture red{1, 1, {255, 0, 0}};
const Picture green{1, 1, {0, 255, 0}};

class VideoPreview : public testing::Test {
protected:
  VideoPreview() {
    preview_ = LMRVideoPreview::previewWithCaptureSession_error(session_, nullptr);
    output_ = platform_.mediaCapture->movieFileOutputs().back();
  }

  // One sample on the connection of that type; how often it was looked into.
  int show(const Picture& picture, MediaType type = MediaType::Video) {
    const lumora::fakes::FakeSampleBuffer sample(platform_.mediaCapture->hostTime(), picture);
    for (const auto& connection : output_->connections()) {
      if (connection->mediaType() == type) {
        EXPECT_TRUE(output_->emitSample(sample, connection));
      }
    }
    return sample.reads();
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::CaptureSession> session_ =
      lumora::tests::runningSessionOfCameraAndMicrophone(*platform_.mediaCapture);
  std::shared_ptr<lumora::fakes::FakeMovieFileOutput> output_;
  std::unique_ptr<LMRVideoPreview> preview_;
};

TEST_F(VideoPreview, looksAtNoPicture_asLongAsNobodyTakesAny) {
  EXPECT_EQ(show(red), 0);
  EXPECT_EQ(preview_->takePicture(4, 4), std::nullopt);
}

TEST_F(VideoPreview, showsThePictureThatCameNext_afterItWasAsked) {
  preview_->takePicture(4, 4);
  EXPECT_EQ(show(red), 1);
  EXPECT_EQ(show(green), 0);
  EXPECT_THAT(preview_->takePicture(4, 4), Optional(red));
  EXPECT_EQ(preview_->takePicture(4, 4), std::nullopt);
  EXPECT_EQ(show(green), 1);
  EXPECT_THAT(preview_->takePicture(4, 4), Optional(green));
}

TEST_F(VideoPreview, leavesSoundAlone) {
  preview_->takePicture(4, 4);
  EXPECT_EQ(show(red, MediaType::Sound), 0);
  EXPECT_EQ(show(red), 1);
}

TEST_F(VideoPreview, leavesTheSession_whenItGoes) {
  EXPECT_THAT(session_->outputs(), SizeIs(1));
  preview_.reset();
  EXPECT_THAT(session_->outputs(), IsEmpty());
}

TEST_F(VideoPreview, tellsTheError_whenTheSessionTakesNoFurtherOutput) {
  const auto refusal = lumora::fakes::captureError(lumora::CaptureErrorCode::NotPossible, "Full");
  std::dynamic_pointer_cast<lumora::fakes::FakeCaptureSession>(session_)->failToAddOutput(refusal);
  LMRErrorRef error;
  EXPECT_EQ(LMRVideoPreview::previewWithCaptureSession_error(session_, &error), nullptr);
  EXPECT_EQ(error, refusal);
  EXPECT_EQ(LMRVideoPreview::previewWithCaptureSession_error(session_, nullptr), nullptr);
}

} // namespace
