#pragma once

#include <LumoraKit/recording/LMRLocalVideoRecorder.h>

/// Records a capture session with the main screen, and a microphone if there is one, into a movie file.
/// On a Wayland desktop the user is asked for the screen when the session starts to run: see
/// lumora::CaptureSession::startRunning.
///
///     LMRErrorRef error;
///     auto session = LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(
///         LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), &error);
///     auto recorder = LMRLocalScreenRecorder::recorderWithCaptureSession(session);
///
/// It records as LMRLocalVideoRecorder does, and differs in the session that it rebuilds when it is decoded.
class LUMORA_EXPORT LMRLocalScreenRecorder : public LMRLocalVideoRecorder {
public:
  /// A new recorder for the session, with a movie-file output of its own.
  static std::shared_ptr<LMRLocalScreenRecorder>
  recorderWithCaptureSession(const std::shared_ptr<lumora::CaptureSession>& captureSession);
  /// An idle recorder for the screen and the archived microphone; null when a device is missing or cannot be opened,
  /// with a log line unless it is the screen. The decoding of LMRLocalVideoRecorder comes first, so that an archive
  /// without a camera, the usual one of this class, is refused. Blocks while devices are opened.
  static std::shared_ptr<LMRLocalScreenRecorder> initWithCoder(const lumora::KeyedUnarchiver& coder);

  explicit LMRLocalScreenRecorder(MadeByFactory key);
  ~LMRLocalScreenRecorder() override;

  std::string className() const override;

protected:
  bool decodeWithCoder(const lumora::KeyedUnarchiver& coder) override;
};
