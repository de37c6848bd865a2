#include <LumoraKit/recording/LMRCaptureDeviceAdditions.h>
#include <LumoraKit/recording/LMRCaptureDeviceInputAdditions.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using namespace LMRCaptureDeviceAdditions;
using lumora::MediaType;
using testing::ElementsAre;
using testing::IsEmpty;

class CaptureDevices : public testing::Test {
protected:
  std::shared_ptr<lumora::fakes::FakeCaptureDevice> add(const std::string& uniqueID, MediaType type) {
    return platform_.mediaCapture->addDevice(uniqueID, {type});
  }

  lumora::fakes::FakePlatform platform_;
};

TEST_F(CaptureDevices, defaultsAreTheMuxedCamera_whenTheMachineHasNothingElse) {
  const auto camera = add("tape camera", MediaType::Muxed);
  EXPECT_EQ(defaultAudioCaptureDevice(), camera);
  EXPECT_EQ(defaultVideoCaptureDevice(), camera);
}

TEST_F(CaptureDevices, defaultsAreThoseOfTheirOwnType_whenThereAreAny) {
  add("tape camera", MediaType::Muxed);
  const auto camera = add("camera", MediaType::Video);
  const auto microphone = add("microphone", MediaType::Sound);
  EXPECT_EQ(defaultAudioCaptureDevice(), microphone);
  EXPECT_EQ(defaultVideoCaptureDevice(), camera);
}

TEST_F(CaptureDevices, defaultIsWhatTheMachineSays) {
  add("first", MediaType::Sound);
  const auto second = add("second", MediaType::Sound);
  platform_.mediaCapture->setDefaultInputDevice(MediaType::Sound, second);
  EXPECT_EQ(defaultAudioCaptureDevice(), second);
}

TEST_F(CaptureDevices, defaultsAreNull_whenTheMachineHasNone) {
  EXPECT_EQ(defaultAudioCaptureDevice(), nullptr);
  EXPECT_EQ(defaultVideoCaptureDevice(), nullptr);
}

TEST_F(CaptureDevices, areListedByType_withTheMuxedOnesLast) {
  const auto muxed = add("tape camera", MediaType::Muxed);
  const auto camera = add("camera", MediaType::Video);
  const auto microphone = add("microphone", MediaType::Sound);
  EXPECT_THAT(audioCaptureDevices(), ElementsAre(microphone, muxed));
  EXPECT_THAT(videoCaptureDevices(), ElementsAre(camera, muxed));
}

TEST_F(CaptureDevices, areListedInTheOrderOfTheTypes_withDuplicates) {
  const auto both = platform_.mediaCapture->addDevice("both", {MediaType::Video, MediaType::Sound});
  const auto camera = add("camera", MediaType::Video);
  EXPECT_THAT(inputDevicesWithMediaTypes({MediaType::Sound, MediaType::Video}), ElementsAre(both, both, camera));
  EXPECT_THAT(inputDevicesWithMediaTypes({}), IsEmpty());
}

TEST_F(CaptureDevices, inputKeepsConnectionsOfTheTypeAsTheyAre_andDisablesTheOthers) {
  const lumora::fakes::FakeCaptureInput input(add("tape camera", MediaType::Muxed));
  const auto video = input.connections()[0];
  const auto sound = input.connections()[1];
  ASSERT_EQ(video->mediaType(), MediaType::Video);
  video->setEnabled(false);
  LMRCaptureDeviceInputAdditions::disableAllConnectionsNotOfMediaType(input, MediaType::Video);
  EXPECT_FALSE(video->isEnabled());
  EXPECT_FALSE(sound->isEnabled());
}

} // namespace
