#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>

std::shared_ptr<LMRLocalScreenRecorder>
LMRLocalScreenRecorder::recorderWithCaptureSession(const std::shared_ptr<lumora::CaptureSession>& captureSession) {
  return makeWithCaptureSession<LMRLocalScreenRecorder>(captureSession);
}

std::shared_ptr<LMRLocalScreenRecorder> LMRLocalScreenRecorder::initWithCoder(const lumora::KeyedUnarchiver& coder) {
  return makeWithCoder<LMRLocalScreenRecorder>(coder);
}

LMRLocalScreenRecorder::LMRLocalScreenRecorder(MadeByFactory key) : LMRLocalVideoRecorder(key) {}

LMRLocalScreenRecorder::~LMRLocalScreenRecorder() = default;

std::string LMRLocalScreenRecorder::className() const {
  return "LMRLocalScreenRecorder";
}

bool LMRLocalScreenRecorder::decodeWithCoder(const lumora::KeyedUnarchiver& coder) {
  return LMRLocalVideoRecorder::decodeWithCoder(coder) &&
         rebuildSession(coder, LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error);
}
