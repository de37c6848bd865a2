#pragma once

#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

/// Records the sound only of a camera that is bound to the server. In everything but its start it is
/// LMRRemoteVideoRecorder.
class LUMORA_EXPORT LMRRemoteAudioRecorder : public LMRRemoteVideoRecorder {
public:
  static std::shared_ptr<LMRRemoteAudioRecorder>
  recorderWithRemoteRecorderName_session(const std::optional<std::string>& remoteRecorderName,
                                         const std::shared_ptr<LMRSession>& session);
  static std::shared_ptr<LMRRemoteAudioRecorder> initWithCoder(const lumora::KeyedUnarchiver& coder);

  using LMRRemoteVideoRecorder::LMRRemoteVideoRecorder;
  ~LMRRemoteAudioRecorder() override;

  std::string className() const override;

  /// Asks the camera for sound only. Blocks. Any thread.
  void startWithDelay(double delay) override;
};
