#include "LectureRecorder.h"

void LectureRecorder::logIn(const std::string& server, const std::string& user, const std::string& password) {
  const auto login = LMRAuthenticationAction::actionWithServer_port_userName_password(server, 0, user, password);
  login->setFinishTarget_selector(shared_from_this(), &LectureRecorder::loggedIn);
  run(login);
}

void LectureRecorder::loggedIn(const std::shared_ptr<LMRAuthenticationAction>& action) {
  session_ = action->session();
  status_ = "Logged in as " + session_->userFullName().value_or("somebody");
}

void LectureRecorder::record() {
  LMRErrorRef error;
  const auto capture = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
      LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), LMRCaptureDeviceAdditions::defaultVideoCaptureDevice(),
      &error);
  if (capture) {
    error = capture->startRunning();
  }
  if (error) {
    status_ = error->localizedDescription();
    return;
  }
  recorder_ = LMRLocalVideoRecorder::recorderWithCaptureSession(capture);
  recorder_->setDelegate(shared_from_this());
  recorder_->bootstrap();
  recorder_->start();
}

void LectureRecorder::stopAndSubmit() {
  recorder_->stop();
}

void LectureRecorder::recorderDidStartRecording(const Recorder& /*recorder*/) {
  status_ = "Recording";
}

void LectureRecorder::recorderDidStopRecording(const Recorder& /*recorder*/) {
  const auto submit = LMRActionFactory::
      actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
          recorder_->outputFileURL()->string(), "lectures",
          lumora::Dictionary{{std::string(LMREpisodeUserMetadataTitleKey), "Lecture"}}, std::nullopt, false, true,
          session_);
  submit->setFinishTarget_selector(shared_from_this(), &LectureRecorder::submitted);
  run(submit);
}

void LectureRecorder::recorderFailedToStopRecording_error(const Recorder& /*recorder*/, const LMRErrorRef& error) {
  status_ = "The recording has ended: " + (error ? error->localizedDescription() : "nothing was recorded");
}

void LectureRecorder::submitted(const std::shared_ptr<LMRAction>& /*action*/) {
  status_ = "Submitted";
}

void LectureRecorder::failed(const KTActionRef& action) {
  status_ = action->error()->localizedDescription();
}

void LectureRecorder::run(const KTActionRef& action) {
  status_ = action->description();
  action->setErrorTarget_selector(shared_from_this(), &LectureRecorder::failed);
  action->start();
}
