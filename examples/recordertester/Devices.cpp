#include "Devices.h"

#include <algorithm>
#include <iomanip>
#include <iostream>

namespace tester {
namespace {

void print(const Devices& devices, const char* heading) {
  std::cout << heading << "\n";
  std::size_t width = 0;
  for (const auto& device : devices.all) {
    width = std::max(width, device->localizedDisplayName().size());
  }
  for (std::size_t i = 0; i < devices.all.size(); ++i) {
    const auto& device = devices.all[i];
    const bool isDefault = devices.standard && device->uniqueID() == devices.standard->uniqueID();
    std::cout << std::right << std::setw(4) << i + 1 << "  " << std::left << std::setw(static_cast<int>(width))
              << device->localizedDisplayName() << "  " << device->uniqueID() << (isDefault ? "  (default)" : "")
              << "\n";
  }
  if (devices.all.empty()) {
    std::cout << "   none\n";
  }
}

std::string refusalOfScreen() {
  lumora::MediaCapture& capture = *lumora::Platform::current().mediaCapture;
  const LMRErrorRef error = capture.makeSession()->addInput(capture.makeScreenInput());
  return error ? error->localizedDescription() : "";
}

} // namespace

Devices Devices::cameras() {
  return {"camera", LMRCaptureDeviceAdditions::videoCaptureDevices(),
          LMRCaptureDeviceAdditions::defaultVideoCaptureDevice()};
}

Devices Devices::microphones() {
  return {"microphone", LMRCaptureDeviceAdditions::audioCaptureDevices(),
          LMRCaptureDeviceAdditions::defaultAudioCaptureDevice()};
}

std::shared_ptr<lumora::CaptureDevice> Devices::find(const std::string& text) const {
  if (text == "default" && standard) {
    return standard;
  }
  for (std::size_t i = 0; i < all.size(); ++i) {
    if (text == std::to_string(i + 1) || text == all[i]->uniqueID() || text == all[i]->localizedDisplayName()) {
      return all[i];
    }
  }
  const std::string count = all.size() == 1 ? "is 1" : "are " + std::to_string(all.size());
  throw Failure{std::string("There is no ") + kind + " \"" + text + "\" (there " + count + ", which --list tells of)."};
}

void listDevices() {
  print(Devices::cameras(), "Cameras");
  print(Devices::microphones(), "Microphones");
  const std::string refusal = refusalOfScreen();
  std::cout << "Screen\n   " << (refusal.empty() ? "the main screen" : refusal) << "\n";
}

} // namespace tester
