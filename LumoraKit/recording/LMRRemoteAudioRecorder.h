#pragma once

#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

/// Records the sound only of a camera that is bound to the server. In everything but its start it is
/// LMRRemoteVideoRecorder.
class LUMORA_EXPORT LMRRemoteAudioRecorder : public LMRRemoteVideoRecorder {
public:
  /// A recorder for the sound of a camera that is bound to the server.
  static std::shared_ptr<LMRRemoteAudioRecorder>
  recorderWithRemoteRecorderName_session(const std::optional<std::string>& remoteRecorderName,
                                         const std::shared_ptr<LMRSession>& session);
  /// An idle recorder for the archived camera, as LMRRemoteVideoRecorder::initWithCoder() makes one.
  static std::shared_ptr<LMRRemoteAudioRecorder> initWithCoder(const lumora::KeyedUnarchiver& coder);

  /// The constructor of LMRRemoteVideoRecorder, with the same meaning.
  using LMRRemoteVideoRecorder::LMRRemoteVideoRecorder;
  ~LMRRemoteAudioRecorder() override;

  std::string className() const override;

  /// Asks the camera for sound only. Blocks. Any thread.
  void startWithDelay(double delay) override;
};
