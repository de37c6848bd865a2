#pragma once

#include <LumoraKit/testing/FakeMediaCapture.h>

#include <memory>
#include <utility>

namespace lumora::tests {

/// A running session of a fake microphone and a fake camera, in this order.
inline std::shared_ptr<CaptureSession> runningSessionOfCameraAndMicrophone(fakes::FakeMediaCapture& capture) {
  auto session = capture.makeSession();
  for (const auto& [name, type] : {std::pair("microphone", MediaType::Sound), std::pair("camera", MediaType::Video)}) {
    const auto device = capture.addDevice(name, {type});
    device->open();
    session->addInput(capture.makeDeviceInput(device));
  }
  session->startRunning();
  return session;
}

} // namespace lumora::tests
