#include "CaptureRig.h"

#include <gmock/gmock.h>

namespace lumora::testing {

class Devices : public CaptureRig {
protected:
  std::vector<std::string> identifiers(MediaType type) const {
    std::vector<std::string> result;
    for (const auto& device : capture().inputDevices(type)) {
      result.push_back(device->uniqueID());
    }
    return result;
  }
};

TEST_F(Devices, areListedOnceByTheirStableNames_whenTheyAreThere) {
  EXPECT_THAT(identifiers(MediaType::Sound), ::testing::ElementsAre("audio:lumora_microphone"));
  EXPECT_THAT(identifiers(MediaType::Video), ::testing::Contains("video:lumora_camera").Times(1));
  EXPECT_THAT(identifiers(MediaType::Muxed), ::testing::IsEmpty());
}

TEST_F(Devices, haveADefaultOfEachKind_whenTheyAreThere) {
  EXPECT_EQ(capture().defaultInputDevice(MediaType::Sound)->uniqueID(), "audio:lumora_microphone");
  EXPECT_TRUE(capture().defaultInputDevice(MediaType::Video)->hasMediaType(MediaType::Video));
  EXPECT_EQ(capture().defaultInputDevice(MediaType::Muxed), nullptr);
}

TEST_F(Devices, areFoundByIdentifier_whenPluggedInLater) {
  EXPECT_EQ(capture().deviceWithUniqueID("audio:lumora_other"), nullptr);
  ASSERT_TRUE(devices_->add("microphone", "lumora_other"));
  const auto device = capture().deviceWithUniqueID("audio:lumora_other");
  ASSERT_NE(device, nullptr);
  EXPECT_EQ(device->open(), nullptr);
  ASSERT_TRUE(devices_->remove("lumora_other"));
  const LMRErrorRef error = device->open();
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), static_cast<std::int64_t>(CaptureErrorCode::DeviceMissing));
}

TEST_F(Devices, doNoHarm_whenTheyAreListedWhileACameraRuns) {
  addCameraAndMicrophone();
  ASSERT_TRUE(devices_->add("camera", "lumora_other"));
  run();
  // Each looks anew.
  for (int i = 0; i < 3; ++i) {
    EXPECT_NE(capture().deviceWithUniqueID("video:lumora_other"), nullptr);
  }
  ASSERT_TRUE(devices_->remove("lumora_other"));
  session_->stopRunning();
  EXPECT_EQ(capture().deviceWithUniqueID("video:lumora_other"), nullptr);
  ASSERT_EQ(session_->startRunning(), nullptr);
}

TEST_F(Devices, areRefusedByASession_whenTheyWereNotOpened) {
  const auto device = capture().deviceWithUniqueID("video:lumora_camera");
  const LMRErrorRef error = session_->addInput(capture().makeDeviceInput(device));
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), static_cast<std::int64_t>(CaptureErrorCode::NotPossible));
}

TEST_F(Devices, areRefusedByASession_whenAddedTwice) {
  addDevice("video:lumora_camera");
  EXPECT_NE(session_->addInput(session_->inputs().front()), nullptr);
  EXPECT_EQ(session_->inputs().size(), 1U);
}

TEST_F(Devices, outputIsRefused_whenItIsInAnotherSession) {
  ASSERT_EQ(session_->addOutput(output_), nullptr);
  EXPECT_NE(capture().makeSession()->addOutput(output_), nullptr);
  session_->removeOutput(output_);
  EXPECT_EQ(capture().makeSession()->addOutput(output_), nullptr);
}

} // namespace lumora::testing
