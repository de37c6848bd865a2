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

} // namespace lumora
