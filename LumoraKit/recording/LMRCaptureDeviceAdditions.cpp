#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRCaptureDeviceAdditions.h>

namespace LMRCaptureDeviceAdditions {
namespace {

lumora::MediaCapture& capture() {
  return *lumora::Platform::current().mediaCapture;
}

std::shared_ptr<lumora::CaptureDevice> defaultDevice(lumora::MediaType type) {
  auto device = capture().defaultInputDevice(type);
  return device ? device : capture().defaultInputDevice(lumora::MediaType::Muxed);
}

} // namespace

std::shared_ptr<lumora::CaptureDevice> defaultAudioCaptureDevice() {
  return defaultDevice(lumora::MediaType::Sound);
}

std::shared_ptr<lumora::CaptureDevice> defaultVideoCaptureDevice() {
  return defaultDevice(lumora::MediaType::Video);
}

Devices audioCaptureDevices() {
  return inputDevicesWithMediaTypes({lumora::MediaType::Sound, lumora::MediaType::Muxed});
}

Devices videoCaptureDevices() {
  return inputDevicesWithMediaTypes({lumora::MediaType::Video, lumora::MediaType::Muxed});
}

Devices inputDevicesWithMediaTypes(const std::vector<lumora::MediaType>& types) {
  Devices all;
  for (const auto type : types) {
    const auto devices = capture().inputDevices(type);
    all.insert(all.end(), devices.begin(), devices.end());
  }
  return all;
}

} // namespace LMRCaptureDeviceAdditions
