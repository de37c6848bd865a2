#include <LumoraKit/recording/LMRRemoteAudioRecorder.h>

std::shared_ptr<LMRRemoteAudioRecorder>
LMRRemoteAudioRecorder::recorderWithRemoteRecorderName_session(const std::optional<std::string>& remoteRecorderName,
                                                               const std::shared_ptr<LMRSession>& session) {
  return std::make_shared<LMRRemoteAudioRecorder>(remoteRecorderName, session);
}

std::shared_ptr<LMRRemoteAudioRecorder> LMRRemoteAudioRecorder::initWithCoder(const lumora::KeyedUnarchiver& coder) {
  return recorderWithRemoteRecorderName_session(archivedName(coder), nullptr);
}

LMRRemoteAudioRecorder::~LMRRemoteAudioRecorder() = default;

std::string LMRRemoteAudioRecorder::className() const {
  return "LMRRemoteAudioRecorder";
}

void LMRRemoteAudioRecorder::startWithDelay(double delay) {
  startWithDelay_audioOnly(delay, true);
}
