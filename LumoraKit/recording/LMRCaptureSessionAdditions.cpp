#include <LumoraKit/login/LMRLocalizedString.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRCaptureDeviceInputAdditions.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>

#include <string>
#include <string_view>

namespace LMRCaptureSessionAdditions {
namespace {

using Input = std::shared_ptr<lumora::CaptureInput>;
using lumora::MediaType;

constexpr std::string_view openingSharedDevice = "captureSessionWithAudioDevice: Error opening audio/video device: %@";
constexpr std::string_view addingSharedInput =
    "captureSessionWithAudioDevice: Error adding audio/video device input: %@";
constexpr std::string_view openingAudioDevice = "captureSessionWithAudioDevice: Error opening audio device: %@";
constexpr std::string_view openingVideoDevice = "captureSessionWithAudioDevice: Error opening video device: %@";
constexpr std::string_view addingAudioInput = "captureSessionWithAudioDevice: Error adding audio device input: %@";
constexpr std::string_view addingVideoInput = "captureSessionWithAudioDevice: Error adding video device input: %@";
constexpr std::string_view addingScreenInput =
    "captureSessionWithScreenInputAndAudioDevice: Error adding screen input: %@";

lumora::MediaCapture& capture() {
  return *lumora::Platform::current().mediaCapture;
}

std::string text(const Device& device) {
  return device ? device->uniqueID() : "(null)";
}

LMRErrorRef missingDevice(std::string_view description) {
  return LMRError::make(LMRRecorderErrorDomain, 1, LMRLocalizedString(description));
}

// Whether a step went well; if not, it is logged and its error told.
bool succeeded(const LMRErrorRef& outcome, std::string_view failure, LMRErrorRef* error) {
  if (outcome) {
    lumora::log(failure, {lumora::text(outcome)});
    *error = outcome;
  }
  return !outcome;
}

// Devices that were opened before a failure are not closed again.
Session sessionWithSharedDevice(const Device& device, LMRErrorRef* error) {
  auto session = capture().makeSession();
  const bool isBuilt = succeeded(device->open(), openingSharedDevice, error) &&
                       succeeded(session->addInput(capture().makeDeviceInput(device)), addingSharedInput, error);
  return isBuilt ? session : nullptr;
}

Input makeInput(const Device& device, MediaType wanted) {
  auto input = capture().makeDeviceInput(device);
  if (device->hasMediaType(MediaType::Muxed)) {
    LMRCaptureDeviceInputAdditions::disableAllConnectionsNotOfMediaType(*input, wanted);
  }
  return input;
}

Session sessionWithTwoDevices(const Device& audioDevice, const Device& videoDevice, LMRErrorRef* error) {
  auto session = capture().makeSession();
  if (!succeeded(audioDevice->open(), openingAudioDevice, error) ||
      !succeeded(videoDevice->open(), openingVideoDevice, error)) {
    return nullptr;
  }
  const auto videoInput = makeInput(videoDevice, MediaType::Video);
  const auto audioInput = makeInput(audioDevice, MediaType::Sound);
  const auto addAudio = [&] { return succeeded(session->addInput(audioInput), addingAudioInput, error); };
  const auto addVideo = [&] { return succeeded(session->addInput(videoInput), addingVideoInput, error); };
  // A muxed camera goes last, any other first.
  const bool isBuilt =
      videoDevice->hasMediaType(MediaType::Muxed) ? addAudio() && addVideo() : addVideo() && addAudio();
  return isBuilt ? session : nullptr;
}

} // namespace

Session captureSessionWithAudioDevice_videoDevice_error(const Device& audioDevice, const Device& videoDevice,
                                                        LMRErrorRef* error) {
  if (!audioDevice || !videoDevice) {
    lumora::log("captureSessionWithAudioDevice:%@ videoDevice:%@ -- cannot be nil",
                {text(audioDevice), text(videoDevice)});
    *error = missingDevice("Cannot find the audio and video devices");
    return nullptr;
  }
  return audioDevice->uniqueID() == videoDevice->uniqueID() ? sessionWithSharedDevice(audioDevice, error)
                                                            : sessionWithTwoDevices(audioDevice, videoDevice, error);
}

Session captureSessionWithAudioDevice_error(const Device& audioDevice, LMRErrorRef* error) {
  if (!audioDevice) {
    lumora::log("captureSessionWithAudioDevice:%@ -- cannot be nil", {text(audioDevice)});
    *error = missingDevice("Cannot find the audio device");
    return nullptr;
  }
  auto session = capture().makeSession();
  if (!succeeded(audioDevice->open(), openingAudioDevice, error)) {
    return nullptr;
  }
  const auto input = makeInput(audioDevice, MediaType::Sound);
  return succeeded(session->addInput(input), addingAudioInput, error) ? session : nullptr;
}

Session captureSessionWithScreenInputAndAudioDevice_error(const Device& audioDevice, LMRErrorRef* error) {
  LMRErrorRef audioError;
  auto session = audioDevice ? captureSessionWithAudioDevice_error(audioDevice, &audioError) : capture().makeSession();
  if (!session || audioError) {
    return session;
  }
  LMRErrorRef screenError;
  if (!succeeded(session->addInput(capture().makeScreenInput()), addingScreenInput, &screenError)) {
    *error = nullptr;
    return nullptr;
  }
  return session;
}

} // namespace LMRCaptureSessionAdditions
