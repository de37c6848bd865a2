#include <LumoraKit/actions/LMRApplicationSupportDirectory.h>
#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Preferences.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>

#include <cerrno>

namespace {

using lumora::MediaType;

constexpr std::string_view audioDeviceKey = "audioDeviceUniqueID";
constexpr std::string_view videoDeviceKey = "videoDeviceUniqueID";

lumora::HostTime hostTime() {
  return lumora::Platform::current().mediaCapture->hostTime();
}

std::optional<std::filesystem::path> destinationFolder() {
  const auto& platform = lumora::Platform::current();
  const auto chosen = platform.preferences->value(platform.application->identifier(), LMRRecorderDestinationFolder);
  if (const std::string* folder = chosen ? chosen->string() : nullptr) {
    return *folder;
  }
  return LMRApplicationSupportDirectory();
}

std::shared_ptr<lumora::CaptureDevice> archivedDevice(const lumora::KeyedUnarchiver& coder, std::string_view key) {
  const auto uniqueID = coder.decodeString(key);
  return uniqueID ? lumora::Platform::current().mediaCapture->deviceWithUniqueID(*uniqueID) : nullptr;
}

void encodeDevice(lumora::KeyedArchiver& coder, const lumora::CaptureInput& input) {
  const auto device = input.device();
  if (!device) {
    return; // the screen
  }
  for (const auto& connection : input.connections()) {
    if (connection->isEnabled()) {
      coder.encode(connection->mediaType() == MediaType::Sound ? audioDeviceKey : videoDeviceKey, device->uniqueID());
    }
  }
}

} // namespace

std::shared_ptr<LMRLocalVideoRecorder>
LMRLocalVideoRecorder::recorderWithCaptureSession(const std::shared_ptr<lumora::CaptureSession>& captureSession) {
  return makeWithCaptureSession<LMRLocalVideoRecorder>(captureSession);
}

std::shared_ptr<LMRLocalVideoRecorder> LMRLocalVideoRecorder::initWithCoder(const lumora::KeyedUnarchiver& coder) {
  return makeWithCoder<LMRLocalVideoRecorder>(coder);
}

LMRLocalVideoRecorder::LMRLocalVideoRecorder(MadeByFactory) {}

LMRLocalVideoRecorder::~LMRLocalVideoRecorder() {
  if (const auto session = captureSession()) {
    session->stopRunning();
  }
}

std::string LMRLocalVideoRecorder::className() const {
  return "LMRLocalVideoRecorder";
}

void LMRLocalVideoRecorder::commonInit() {
  const auto output = lumora::Platform::current().mediaCapture->makeMovieFileOutput();
  output->setDelegate(std::static_pointer_cast<LMRLocalVideoRecorder>(shared_from_this()));
  movieFileOutput_.set(output);
  deleteMovieFileWhenItFinishesRecording_ = false;
  isSubmitted_ = false;
}

void LMRLocalVideoRecorder::bootstrap() {
  const auto session = captureSession();
  lumora::assertThat(session != nullptr, "self.captureSession != nil", "bootstrap", "LMRLocalVideoRecorder");
  if (const auto error = session->addOutput(movieFileOutput())) {
    failedToStartRecordingWithError(error);
    return;
  }
  setCompressionOptionsOfConnections();
  const auto folder = destinationFolder();
  if (!folder) {
    failedToStartRecordingWithError(LMRError::fromErrno(ENOENT, "application-support folder"));
    return;
  }
  setOutputFileURL(*folder / (lumora::makeUUIDString() + ".mov"));
}

void LMRLocalVideoRecorder::setCompressionOptionsOfConnections() const {
  const auto output = movieFileOutput();
  for (const auto& connection : output->connections()) {
    const auto options =
        connection->mediaType() == MediaType::Video ? videoCompressionOptions() : audioCompressionOptions();
    if (options) {
      output->setCompressionOptions_forConnection(*options, connection);
    }
  }
}

// The delay is ignored: the file starts at the next sample, and whoever wants a delay waits before the request.
void LMRLocalVideoRecorder::startWithDelay(double) {
  setIsStarting(true);
  hostTimeToStart_.set(hostTime());
}

void LMRLocalVideoRecorder::pause() {
  hostTimeToPause_.set(hostTime());
}

void LMRLocalVideoRecorder::resume() {
  hostTimeToResume_.set(hostTime());
}

void LMRLocalVideoRecorder::stop() {
  if (!finishFile()) {
    failedToStopRecordingWithError(nullptr);
  }
}

// The flag stays set also when nothing is being written.
void LMRLocalVideoRecorder::cancel() {
  deleteMovieFileWhenItFinishesRecording_ = true;
  if (!finishFile()) {
    failedToCancelRecordingWithError(nullptr);
  }
}

// False when no file is being written.
bool LMRLocalVideoRecorder::finishFile() const {
  const auto output = movieFileOutput();
  if (!output->outputFileURL()) {
    return false;
  }
  output->recordToOutputFileURL(std::nullopt);
  return true;
}

void LMRLocalVideoRecorder::encodeWithCoder(lumora::KeyedArchiver& coder) const {
  const auto session = captureSession();
  if (!session) {
    return;
  }
  for (const auto& input : session->inputs()) {
    encodeDevice(coder, *input);
  }
}

// Subclasses come through here as well, so theirs need a camera too. The output made first is replaced once there is
// a session.
bool LMRLocalVideoRecorder::decodeWithCoder(const lumora::KeyedUnarchiver& coder) {
  commonInit();
  LMRErrorRef error;
  const auto session = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
      archivedDevice(coder, audioDeviceKey), archivedDevice(coder, videoDeviceKey), &error);
  if (!takeDecodedSession(session, error)) {
    return false;
  }
  commonInit();
  return true;
}

bool LMRLocalVideoRecorder::rebuildSession(const lumora::KeyedUnarchiver& coder, SessionOfAudioDevice makeSession) {
  LMRErrorRef error;
  const auto session = makeSession(archivedDevice(coder, audioDeviceKey), &error);
  return takeDecodedSession(session, error);
}

bool LMRLocalVideoRecorder::takeDecodedSession(const std::shared_ptr<lumora::CaptureSession>& session,
                                               const LMRErrorRef& error) {
  if (error) {
    lumora::log("Error unarchiving %@: %@", {className(), lumora::text(error)});
  }
  if (session) {
    setCaptureSession(session);
  }
  return session != nullptr;
}
