#include <LumoraKit/recording/LMRCaptureDeviceInputAdditions.h>

namespace LMRCaptureDeviceInputAdditions {

void disableAllConnectionsNotOfMediaType(const lumora::CaptureInput& input, lumora::MediaType type) {
  for (const auto& connection : input.connections()) {
    if (connection->mediaType() != type) {
      connection->setEnabled(false);
    }
  }
}

} // namespace LMRCaptureDeviceInputAdditions
