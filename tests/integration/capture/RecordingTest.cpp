#include "CaptureRig.h"

namespace lumora::testing {

using namespace std::chrono_literals;

using Recording = CaptureRig;

TEST_F(Recording, writesAMovie_whenCameraAndMicrophoneRun) {
  addCameraAndMicrophone();
  run();
  record(file("a.mov"), 3s);
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start will-finish did-finish");
  const LMRErrorRef error = delegate_->lastError();
  EXPECT_EQ(error, nullptr) << error->description();
}

} // namespace lumora::testing
