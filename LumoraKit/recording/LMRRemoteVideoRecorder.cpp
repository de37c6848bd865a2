#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

namespace {

constexpr std::string_view remoteRecorderNameKey = "remoteRecorderName";

// Cuts off the fraction. What no unsigned number of 64 bits can hold is the caller's error, and counts as no delay.
std::uint64_t wholeSeconds(double delay) {
  return delay >= 0 && delay < 0x1p64 ? static_cast<std::uint64_t>(delay) : 0;
}

lumora::Dictionary emptyTitleAndDescription() {
  return {{std::string(LMREpisodeUserMetadataTitleKey), ""}, {std::string(LMREpisodeUserMetadataDescriptionKey), ""}};
}

} // namespace

std::shared_ptr<LMRRemoteVideoRecorder>
LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(const std::optional<std::string>& remoteRecorderName,
                                                               const std::shared_ptr<LMRSession>& session) {
  return std::make_shared<LMRRemoteVideoRecorder>(remoteRecorderName, session);
}

std::shared_ptr<LMRRemoteVideoRecorder> LMRRemoteVideoRecorder::initWithCoder(const lumora::KeyedUnarchiver& coder) {
  return recorderWithRemoteRecorderName_session(archivedName(coder), nullptr);
}

LMRRemoteVideoRecorder::LMRRemoteVideoRecorder(std::optional<std::string> remoteRecorderName,
                                               std::shared_ptr<LMRSession> session)
    : session_(std::move(session)), metadata_(lumora::Dictionary()),
      remoteRecorderName_(std::move(remoteRecorderName)) {}

LMRRemoteVideoRecorder::~LMRRemoteVideoRecorder() = default;

std::string LMRRemoteVideoRecorder::className() const {
  return "LMRRemoteVideoRecorder";
}

bool LMRRemoteVideoRecorder::isRemote() const {
  return true;
}

void LMRRemoteVideoRecorder::startWithDelay(double delay) {
  startWithDelay_audioOnly(delay, false);
}

void LMRRemoteVideoRecorder::startWithDelay_audioOnly(double delay, bool audioOnly) {
  setIsStarting(true);
  setDelayBeforeRecording(wholeSeconds(delay));
  run(LMRActionFactory::actionToStartRemoteCamera_afterDelay_audioOnly_session(
          remoteRecorderName(), delayBeforeRecording(), audioOnly, session()),
      &LMRRemoteVideoRecorder::recordingStartedWithAction, &LMRRemoteVideoRecorder::failedToStartRecordingWithAction);
}

void LMRRemoteVideoRecorder::pause() {
  run(LMRActionFactory::actionToPauseRemoteCamera_session(remoteRecorderName(), session()),
      &LMRRemoteVideoRecorder::pausedRecordingWithAction, &LMRRemoteVideoRecorder::failedToPauseRecordingWithAction);
}

void LMRRemoteVideoRecorder::resume() {
  run(LMRActionFactory::actionToResumeRemoteCamera_session(remoteRecorderName(), session()),
      &LMRRemoteVideoRecorder::resumedRecordingWithAction, &LMRRemoteVideoRecorder::failedToResumeRecordingWithAction);
}

// Metadata that are empty are sent as they are; only absent ones are filled in.
void LMRRemoteVideoRecorder::stop() {
  if (!metadata()) {
    setMetadata(emptyTitleAndDescription());
  }
  run(stopAction(), &LMRRemoteVideoRecorder::stoppedRecordingWithAction,
      &LMRRemoteVideoRecorder::failedToStopRecordingWithAction);
}

std::shared_ptr<LMRAction> LMRRemoteVideoRecorder::stopAction() const {
  if (const auto uuid = submissionUUID()) {
    return LMRActionFactory::actionToStopRemoteCamera_andSubmitToSubmissionUUID_withMetadata_session(
        remoteRecorderName(), uuid, metadata(), session());
  }
  return LMRActionFactory::actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session(
      remoteRecorderName(), workflow(), metadata(), session());
}

void LMRRemoteVideoRecorder::cancel() {
  run(LMRActionFactory::actionToCancelRemoteCamera_session(remoteRecorderName(), session()),
      &LMRRemoteVideoRecorder::cancelledRecordingWithAction,
      &LMRRemoteVideoRecorder::failedToCancelRecordingWithAction);
}

void LMRRemoteVideoRecorder::run(const std::shared_ptr<LMRAction>& action, ActionTarget succeeded,
                                 ActionTarget failed) {
  const auto self = std::static_pointer_cast<LMRRemoteVideoRecorder>(shared_from_this());
  action->setFinishTarget_selector(self, succeeded);
  action->setErrorTarget_selector(self, failed);
  action->runSynchronously();
}

void LMRRemoteVideoRecorder::recordingStartedWithAction(const std::shared_ptr<LMRAction>&) {
  didStartRecording();
}

void LMRRemoteVideoRecorder::failedToStartRecordingWithAction(const std::shared_ptr<LMRAction>& action) {
  failedToStartRecordingWithError(action->error());
}

void LMRRemoteVideoRecorder::pausedRecordingWithAction(const std::shared_ptr<LMRAction>&) {
  didPauseRecording();
}

void LMRRemoteVideoRecorder::failedToPauseRecordingWithAction(const std::shared_ptr<LMRAction>& action) {
  failedToPauseRecordingWithError(action->error());
}

void LMRRemoteVideoRecorder::resumedRecordingWithAction(const std::shared_ptr<LMRAction>&) {
  didResumeRecording();
}

void LMRRemoteVideoRecorder::failedToResumeRecordingWithAction(const std::shared_ptr<LMRAction>& action) {
  failedToResumeRecordingWithError(action->error());
}

void LMRRemoteVideoRecorder::stoppedRecordingWithAction(const std::shared_ptr<LMRAction>&) {
  didStopRecording();
}

void LMRRemoteVideoRecorder::failedToStopRecordingWithAction(const std::shared_ptr<LMRAction>& action) {
  failedToStopRecordingWithError(action->error());
}

void LMRRemoteVideoRecorder::cancelledRecordingWithAction(const std::shared_ptr<LMRAction>&) {
  didCancelRecording();
}

void LMRRemoteVideoRecorder::failedToCancelRecordingWithAction(const std::shared_ptr<LMRAction>& action) {
  failedToCancelRecordingWithError(action->error());
}

void LMRRemoteVideoRecorder::encodeWithCoder(lumora::KeyedArchiver& coder) const {
  if (const auto name = remoteRecorderName()) {
    coder.encode(remoteRecorderNameKey, *name);
  }
}

std::optional<std::string> LMRRemoteVideoRecorder::archivedName(const lumora::KeyedUnarchiver& coder) {
  return coder.decodeString(remoteRecorderNameKey);
}
