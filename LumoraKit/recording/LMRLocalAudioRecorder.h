#pragma once

#include <LumoraKit/recording/LMRLocalVideoRecorder.h>

/// Records a capture session with a microphone only into a movie file.
///
///     LMRErrorRef error;
///     auto session = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(
///         LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), &error);
///     auto recorder = LMRLocalAudioRecorder::recorderWithCaptureSession(session);
///
/// Without pictures there is no sample to wait for: the recorder asks its output directly, for the start on the next
/// turn of the caller's queue, for pause and resume at once. Everything else is as LMRLocalVideoRecorder has it.
class LUMORA_EXPORT LMRLocalAudioRecorder : public LMRLocalVideoRecorder {
public:
  /// A new recorder for the session, with a movie-file output of its own.
  static std::shared_ptr<LMRLocalAudioRecorder>
  recorderWithCaptureSession(const std::shared_ptr<lumora::CaptureSession>& captureSession);
  /// An idle recorder for the archived microphone; null, with a log line, when a device is missing or cannot be opened.
  /// The decoding of LMRLocalVideoRecorder comes first, so that an archive without a camera, the usual one of this
  /// class, is refused. Blocks while devices are opened.
  static std::shared_ptr<LMRLocalAudioRecorder> initWithCoder(const lumora::KeyedUnarchiver& coder);

  explicit LMRLocalAudioRecorder(MadeByFactory key);
  ~LMRLocalAudioRecorder() override;

  std::string className() const override;

  /// Begins the file on the next turn of the queue that the caller runs on; on a worker when it runs on none. The delay
  /// is ignored. The recorder lives at least until then. Any thread.
  void startWithDelay(double delay) override;
  /// Pauses the file at once. Any thread.
  void pause() override;
  /// Goes on with the paused file at once. Any thread.
  void resume() override;

protected:
  bool decodeWithCoder(const lumora::KeyedUnarchiver& coder) override;

private:
  void beginFileNow();
};
