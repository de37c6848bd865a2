#include "Sources.h"

#include "Devices.h"

namespace tester {
namespace {

using Session = std::shared_ptr<lumora::CaptureSession>;
using Device = std::shared_ptr<lumora::CaptureDevice>;

void require(const LMRErrorRef& error) {
  if (error) {
    throw Failure{error->localizedDescription() + "."};
  }
}

Session made(const Session& session, const LMRErrorRef& error, const std::string& what) {
  require(error);
  if (!session) {
    throw Failure{what + " cannot be recorded."};
  }
  return session;
}

// There is no ready-made session of a camera without sound.
Session sessionOf(const Device& camera) {
  lumora::MediaCapture& capture = *lumora::Platform::current().mediaCapture;
  Session session = capture.makeSession();
  require(camera->open());
  require(session->addInput(capture.makeDeviceInput(camera)));
  return session;
}

Session sessionOf(const Device& camera, const Device& microphone) {
  LMRErrorRef error;
  const Session session =
      LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(microphone, camera, &error);
  return made(session, error, camera->localizedDisplayName());
}

// CAMERA or CAMERA+MICROPHONE.
Source openCamera(const std::string& text, std::size_t number) {
  const auto plus = text.find('+');
  const Device camera = Devices::cameras().find(text.substr(0, plus));
  const std::string name = "camera-" + std::to_string(number);
  if (plus == std::string::npos) {
    return {name, LMRLocalVideoRecorder::recorderWithCaptureSession(sessionOf(camera))};
  }
  const Device microphone = Devices::microphones().find(text.substr(plus + 1));
  return {name, LMRLocalVideoRecorder::recorderWithCaptureSession(sessionOf(camera, microphone))};
}

Source openMicrophone(const std::string& text, std::size_t number) {
  const Device microphone = Devices::microphones().find(text);
  LMRErrorRef error;
  const Session session = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(microphone, &error);
  return {"microphone-" + std::to_string(number),
          LMRLocalAudioRecorder::recorderWithCaptureSession(made(session, error, microphone->localizedDisplayName()))};
}

Source openScreen(const std::string& microphoneText) {
  const Device microphone = microphoneText.empty() ? nullptr : Devices::microphones().find(microphoneText);
  LMRErrorRef error;
  const Session session =
      LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(microphone, &error);
  return {"screen", LMRLocalScreenRecorder::recorderWithCaptureSession(made(session, error, "The screen"))};
}

std::filesystem::path freeName(const std::filesystem::path& folder, const std::string& name) {
  std::filesystem::path file = folder / (name + ".mov");
  for (int take = 2; std::filesystem::exists(file); ++take) {
    file = folder / (name + "-take-" + std::to_string(take) + ".mov");
  }
  return std::filesystem::absolute(file).lexically_normal();
}

} // namespace

std::vector<Source> openSources(const Options& options) {
  std::vector<Source> sources;
  for (const std::string& camera : options.cameras) {
    sources.push_back(openCamera(camera, sources.size() + 1));
  }
  if (options.screen) {
    sources.push_back(openScreen(options.screenMicrophone));
  }
  for (std::size_t i = 0; i < options.microphones.size(); ++i) {
    sources.push_back(openMicrophone(options.microphones[i], i + 1));
  }
  for (const Source& source : sources) {
    require(source.recorder->captureSession()->startRunning());
  }
  return sources;
}

void nameFiles(const std::vector<Source>& sources, const std::filesystem::path& folder) {
  for (const Source& source : sources) {
    source.recorder->setOutputFileURL(freeName(folder, source.name));
  }
}

} // namespace tester
