#include <LumoraKit/LumoraKit.h>

#include <iostream>

namespace {

// Prints an error; whether there was one.
bool failed(const LMRErrorRef& error) {
  if (error) {
    std::cerr << error->localizedDescription() << "\n";
  }
  return error != nullptr;
}

// What the recorder reports. Its messages come on the main thread.
class Outcome : public LMRDelegateImplementation<Outcome> {
public:
  void recorderDidStopRecording(const Recorder& /*recorder*/) override { isFinished = true; }
  void recorderFailedToStartRecording_error(const Recorder& /*recorder*/, const LMRErrorRef& error) override {
    hasFailed = true;
    failed(error);
  }
  void recorderFailedToStopRecording_error(const Recorder& /*recorder*/, const LMRErrorRef& error) override {
    hasFailed = true;
    failed(error);
  }

  bool isFinished = false;
  bool hasFailed = false;
};

// The session that every further operation takes; null when the login failed.
std::shared_ptr<LMRSession> logIn(const std::string& user, const std::string& password) {
  const auto login = LMRAuthenticationAction::actionWithServer_port_userName_password("localhost", 0, user, password);
  login->runSynchronously();
  failed(login->error());
  return login->session();
}

// The first workflow that takes one recording of a camera.
std::optional<std::string> chooseWorkflow(const std::shared_ptr<LMRSession>& session) {
  const auto list = LMRActionFactory::actionToListWorkflowsWithSession(session);
  list->runSynchronously();
  failed(list->error());
  const auto reply = list->result();
  const lumora::Array* const workflows = reply ? reply->array(LMRWorkflowsKey) : nullptr;
  for (const lumora::Value& entry : workflows ? *workflows : lumora::Array()) {
    if (entry.dictionary() && LMRWorkflowAdditions::acceptsVideo(*entry.dictionary())) {
      return entry.dictionary()->string(LMRWorkflowNameKey);
    }
  }
  return std::nullopt;
}

// The finished movie file, with camera and microphone; nothing when something failed.
std::optional<std::string> record(double seconds) {
  LMRErrorRef error;
  const auto devices = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
      LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), LMRCaptureDeviceAdditions::defaultVideoCaptureDevice(),
      &error);
  if (devices) {
    error = devices->startRunning();
  }
  if (failed(error) || !devices) {
    return std::nullopt;
  }
  const auto outcome = std::make_shared<Outcome>();
  const auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(devices);
  recorder->setDelegate(outcome);
  recorder->bootstrap();
  recorder->start();
  // A program without a main loop serves the main thread itself.
  const auto& mainThread = lumora::Platform::current().mainThread;
  mainThread->serveUntil([&] { return outcome->hasFailed || recorder->elapsedRecordingTime() >= seconds; });
  recorder->stop();
  mainThread->serveUntil([&] { return outcome->hasFailed || outcome->isFinished; });
  return outcome->hasFailed ? std::nullopt : std::optional(recorder->outputFileURL()->string());
}

bool submit(const std::string& file, const std::string& workflow, const std::shared_ptr<LMRSession>& session) {
  const auto submission = LMRActionFactory::
      actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
          file, workflow, lumora::Dictionary{{std::string(LMREpisodeUserMetadataTitleKey), "My first lecture"}},
          std::nullopt, /*asynchronous*/ false, /*deleteAfterSubmission*/ true, session);
  submission->runSynchronously();
  return !failed(submission->error());
}

} // namespace

// lecture SERVER-FOLDER USER: records five seconds and submits them. The password comes on standard input.
int main(int argc, char** argv) {
  if (argc != 3) {
    return 2;
  }
  lumora::Application::setIdentity("org.example.lecture", "Lecture");
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(argv[1], platform.toolRunner);
  lumora::Platform::install(platform);

  std::string password;
  std::getline(std::cin, password);
  const auto session = logIn(argv[2], password);
  const auto workflow = session ? chooseWorkflow(session) : std::nullopt;
  const auto file = workflow ? record(5) : std::nullopt;
  if (!file || !submit(*file, *workflow, session)) {
    return 1;
  }
  std::cout << "Submitted to " << *workflow << ".\n";
}
