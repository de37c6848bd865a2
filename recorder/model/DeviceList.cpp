#include "recorder/model/DeviceList.h"

#include <algorithm>
#include <utility>

namespace recorder {
namespace {

SourceDescriptions described(SourceKind kind, const LMRCaptureDeviceAdditions::Devices& devices,
                             const std::shared_ptr<lumora::CaptureDevice>& first) {
  SourceDescriptions descriptions;
  for (const auto& device : devices) {
    descriptions.push_back({kind, device->uniqueID(), device->localizedDisplayName()});
  }
  std::stable_partition(descriptions.begin(), descriptions.end(),
                        [&](const SourceDescription& each) { return first && each.identifier == first->uniqueID(); });
  return descriptions;
}

} // namespace

void DeviceList::refresh() {
  if (isLooking_) {
    return;
  }
  isLooking_ = true;
  lumora::Platform::current().queues->concurrentQueue()->async([weak = weak_from_this()] {
    lumora::Platform::current().queues->mainQueue()->async([weak, found = look()] {
      if (const auto self = weak.lock()) {
        self->take(found);
      }
    });
  });
}

void DeviceList::findEncoders() {
  lumora::Platform::current().queues->concurrentQueue()->async([weak = weak_from_this()] {
    auto encoders = lumora::Platform::current().mediaCapture->encoders("h264");
    lumora::Platform::current().queues->mainQueue()->async([weak, encoders = std::move(encoders)] {
      if (const auto self = weak.lock()) {
        self->encoders_ = encoders;
        self->changed.notify();
      }
    });
  });
}

DeviceList::Found DeviceList::look() {
  using namespace LMRCaptureDeviceAdditions;
  auto& capture = *lumora::Platform::current().mediaCapture;
  const bool hasScreen = !capture.makeSession()->addInput(capture.makeScreenInput());
  return {described(SourceKind::Camera, videoCaptureDevices(), defaultVideoCaptureDevice()),
          described(SourceKind::Microphone, audioCaptureDevices(), defaultAudioCaptureDevice()), hasScreen};
}

void DeviceList::take(Found found) {
  isLooking_ = false;
  if (std::exchange(isKnown_, true) && found == found_) {
    return;
  }
  found_ = std::move(found);
  changed.notify();
}

} // namespace recorder
