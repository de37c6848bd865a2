#include <LumoraKit/platform/MediaCapture.h>

namespace lumora {

CaptureDevice::~CaptureDevice() = default;
CaptureConnection::~CaptureConnection() = default;
CaptureInput::~CaptureInput() = default;
SampleBuffer::~SampleBuffer() = default;
MovieFileOutputDelegate::~MovieFileOutputDelegate() = default;
MovieFileOutput::~MovieFileOutput() = default;
CaptureSession::~CaptureSession() = default;
MediaCapture::~MediaCapture() = default;

std::vector<SoundLevel> SampleBuffer::soundLevels() const {
  return {};
}

std::optional<Picture> SampleBuffer::picture(std::uint32_t, std::uint32_t) const {
  return std::nullopt;
}

std::vector<MediaEncoder> MediaCapture::encoders(const std::string&) {
  return {};
}

void MovieFileOutput::recordToOutputFileURL_atHostTime(const std::filesystem::path& file, HostTime) {
  recordToOutputFileURL(file);
}

void MovieFileOutput::pauseRecordingAtHostTime(HostTime) {
  pauseRecording();
}

void MovieFileOutput::resumeRecordingAtHostTime(HostTime) {
  resumeRecording();
}

} // namespace lumora
