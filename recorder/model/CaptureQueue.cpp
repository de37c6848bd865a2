#include "recorder/model/CaptureQueue.h"

#include "recorder/model/Texts.h"

namespace recorder {
namespace {

using Device = std::shared_ptr<lumora::CaptureDevice>;
using Session = std::shared_ptr<lumora::CaptureSession>;

Device deviceOf(const std::string& identifier) {
  return identifier.empty() ? nullptr : lumora::Platform::current().mediaCapture->deviceWithUniqueID(identifier);
}

// There is no ready-made session of a camera without sound.
Session sessionOfCamera(const Device& camera, LMRErrorRef* error) {
  auto& capture = *lumora::Platform::current().mediaCapture;
  auto session = capture.makeSession();
  *error = camera->open();
  if (!*error) {
    *error = session->addInput(capture.makeDeviceInput(camera));
  }
  return *error ? nullptr : session;
}

LMRErrorRef missing(const std::string& name) {
  return LMRError::make(LMRRecorderErrorDomain, 1, filled("%1 is not connected", {name}));
}

Session sessionOf(const PlannedSource& plan, const Device& microphone, LMRErrorRef* error) {
  if (plan.source.kind == SourceKind::Screen) {
    return LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(microphone, error);
  }
  const Device device = deviceOf(plan.source.identifier);
  if (!device) {
    *error = missing(plan.source.name);
    return nullptr;
  }
  if (plan.source.kind == SourceKind::Microphone) {
    return LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(device, error);
  }
  return microphone
             ? LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(microphone, device, error)
             : sessionOfCamera(device, error);
}

} // namespace

std::shared_ptr<lumora::WorkQueue> captureQueue() {
  constexpr const char* label = "org.vantor.lumora.recorder.capture";
  static std::weak_ptr<lumora::Queues> owner;
  static std::shared_ptr<lumora::WorkQueue> queue;
  const auto queues = lumora::Platform::current().queues;
  if (owner.lock() != queues) {
    owner = queues;
    queue = queues->makeSerialQueue(label);
  }
  return queue;
}

Session makeSession(const PlannedSource& plan, LMRErrorRef* error) {
  const Device microphone = deviceOf(plan.microphone);
  if (!plan.microphone.empty() && !microphone) {
    *error = missing(text("The microphone"));
    return nullptr;
  }
  auto session = sessionOf(plan, microphone, error);
  if (!session && !*error) {
    *error = LMRError::make(LMRRecorderErrorDomain, 1, filled("%1 cannot be recorded", {plan.source.name}));
  }
  return session;
}

} // namespace recorder
