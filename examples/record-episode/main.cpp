// Records an episode from the default camera and microphone and submits it to a server: the whole road that a
// recording application goes, from the login to the accepted submission.

#include "Stage.h"

#include <LumoraKit/LumoraKit.h>

#include <algorithm>
#include <iomanip>
#include <iostream>
#include <sstream>

namespace {

using stage::Failure;
using stage::waitUntil;

// A failed step of the road, as a sentence.
[[noreturn]] void fail(const std::string& step, const LMRErrorRef& error) {
  throw Failure{step + (error ? ": " + error->localizedDescription() : "") + "."};
}

// Every server operation is an action: it is started, and its end is told on the main thread.
void runAction(const KTActionRef& action) {
  action->start();
  waitUntil([&] { return !action->isRunning(); }, [&] { return action->description(); });
  if (action->error()) {
    fail(action->description(), action->error());
  }
}

// 1. Log in. The session that comes out of it goes with every later operation.
std::shared_ptr<LMRSession> logIn(const std::string& user, const std::string& password) {
  const auto login = LMRAuthenticationAction::actionWithServer_port_userName_password("localhost", 0, user, password);
  runAction(login);
  std::cout << "Logged in to " << login->session()->description() << " as "
            << login->session()->userFullName().value_or(user) << ".\n";
  return login->session();
}

// 2. Learn what the server does with recordings, and pick a workflow that takes one camera recording.
std::string chooseWorkflow(const std::shared_ptr<LMRSession>& session) {
  const auto list = LMRActionFactory::actionToListWorkflowsWithSession(session);
  runAction(list);
  const auto reply = list->result();
  const lumora::Array none;
  const lumora::Array* workflows = reply ? reply->array(LMRWorkflowsKey) : nullptr;
  for (const lumora::Value& entry : workflows ? *workflows : none) {
    const lumora::Dictionary* workflow = entry.dictionary();
    if (workflow && LMRWorkflowAdditions::acceptsVideo(*workflow)) {
      std::cout << "Workflow: " << workflow->string(LMRWorkflowTitleKey).value_or("") << ".\n";
      return workflow->string(LMRWorkflowNameKey).value_or("");
    }
  }
  throw Failure{"The server has no workflow that takes a camera recording."};
}

// 3. Open the devices. The session runs from here on, as it would for a preview.
std::shared_ptr<lumora::CaptureSession> openDevices() {
  const auto microphone = LMRCaptureDeviceAdditions::defaultAudioCaptureDevice();
  const auto camera = LMRCaptureDeviceAdditions::defaultVideoCaptureDevice();
  LMRErrorRef error;
  const auto session =
      LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(microphone, camera, &error);
  if (!session) {
    fail("The devices could not be opened", error);
  }
  if (const LMRErrorRef refused = session->startRunning()) {
    fail("The devices could not be started", refused);
  }
  std::cout << "Camera: " << camera->localizedDisplayName() << ". Microphone: " << microphone->localizedDisplayName()
            << ".\n";
  return session;
}

// What the recorder reports, on the main thread. A delegate implements only what it wants to hear.
class Progress : public LMRDelegateImplementation<Progress> {
public:
  void recorderFailedToStartRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToPauseRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToResumeRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToStopRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToCancelRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderDidStopRecording(const Recorder&) override { ended_ = true; }
  void recorderDidCancelRecording(const Recorder&) override { ended_ = true; }

  bool hasEnded() const { return ended_; }
  // Waits for the condition, unless the recording fails before.
  void waitFor(LMRSourceRecorder& recorder, const std::string& what, const std::function<bool()>& condition) {
    waitUntil([&] { return failed_ || condition(); },
              [&] {
                std::ostringstream line;
                line << what << " " << std::fixed << std::setprecision(1) << recorder.elapsedRecordingTime() << " s";
                return line.str();
              });
    if (failed_) {
      fail("The recording failed", error_);
    }
  }

private:
  void failed(const LMRErrorRef& error) {
    failed_ = ended_ = true;
    error_ = error;
  }

  bool failed_ = false;
  bool ended_ = false;
  LMRErrorRef error_;
};

// 4. Record, with a pause in the middle. Each request returns at once; what came of it arrives later.
void record(LMRLocalVideoRecorder& recorder, Progress& progress, double seconds) {
  recorder.start();
  progress.waitFor(recorder, "Recording", [&] { return recorder.elapsedRecordingTime() >= seconds / 2; });
  recorder.pause();
  progress.waitFor(recorder, "Pausing", [&] { return recorder.isPaused(); });
  const auto pausedUntil = std::chrono::steady_clock::now() + std::chrono::seconds(1);
  progress.waitFor(recorder, "Paused", [&] { return std::chrono::steady_clock::now() >= pausedUntil; });
  recorder.resume();
  progress.waitFor(recorder, "Recording", [&] { return recorder.elapsedRecordingTime() >= seconds; });
  recorder.stop();
  progress.waitFor(recorder, "Finishing", [&] { return progress.hasEnded(); });
  std::cout << "Recorded " << std::fixed << std::setprecision(1) << recorder.elapsedRecordingTime() << " s to "
            << recorder.outputFileURL()->filename().string() << ".\n";
}

std::shared_ptr<LMRLocalVideoRecorder> recordEpisode(double seconds) {
  const auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(openDevices());
  const auto progress = std::make_shared<Progress>();
  recorder->setDelegate(progress);
  recorder->bootstrap();
  try {
    record(*recorder, *progress, seconds);
  } catch (const Failure&) {
    // Ctrl-C, or a device that was lost: the file goes, and so does the recording.
    recorder->cancel();
    waitUntil([&] { return progress->hasEnded(); }, [] { return "Cancelling"; });
    throw;
  }
  return recorder;
}

// 5. Hand the file to the workflow, with what the user says about it and what the recorder knows.
void submit(const LMRLocalVideoRecorder& recorder, const std::string& workflow,
            const std::shared_ptr<LMRSession>& session) {
  const auto date = [](const std::optional<lumora::WallTime>& time) {
    return std::chrono::floor<std::chrono::seconds>(time.value_or(lumora::WallTime()));
  };
  const lumora::Dictionary userMetadata = {
      {std::string(LMREpisodeUserMetadataTitleKey), "Waves and tones"},
      {std::string(LMREpisodeUserMetadataDescriptionKey), "Recorded by the tutorial."},
  };
  const lumora::Dictionary recordingMetadata = {
      {std::string(LMREpisodeRecordingMetadataStartDateKey), date(recorder.recordingStartDate())},
      {std::string(LMREpisodeRecordingMetadataStopDateKey), date(recorder.recordingStopDate())},
      {std::string(LMREpisodeRecordingMetadataDurationKey), recorder.elapsedRecordingTime()},
  };
  const bool asynchronous = false;
  const bool deleteAfterSubmission = true;
  runAction(LMRActionFactory::
                actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
                    recorder.outputFileURL()->string(), workflow, userMetadata, recordingMetadata, asynchronous,
                    deleteAfterSubmission, session));
  std::cout << "Submitted.\n";
}

// 6. See what arrived: the server's record, and the media facts read back from the file that it stores.
void report(const stage::Server& server) {
  std::cout << "\nThe server's record:\n" << server.episodes();
  for (const auto& movie : server.storedMovies()) {
    std::cout << "\n" << movie.filename().string() << ":\n";
    for (const std::string& track : server.mediaFacts(movie)) {
      std::cout << "  " << track << "\n";
    }
  }
}

void recordAndSubmitAnEpisode(double seconds, const std::string& keptMovie) {
  const std::string user = "ada";
  const std::string password = lumora::makeUUIDString();
  const stage::TemporaryHome home;
  const stage::Server server(home.path() / "server", user, password);
  const auto session = logIn(user, password);
  const std::string workflow = chooseWorkflow(session);
  submit(*recordEpisode(seconds), workflow, session);
  report(server);
  if (!keptMovie.empty()) {
    std::filesystem::copy_file(server.storedMovies().at(0), keptMovie);
  }
}

int checkDevices() {
  const bool found =
      LMRCaptureDeviceAdditions::defaultAudioCaptureDevice() && LMRCaptureDeviceAdditions::defaultVideoCaptureDevice();
  return found ? 0 : 1;
}

} // namespace

// record-episode [--seconds N] [--keep MOVIE] | --check-devices
int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  const auto option = [&](const std::string& name, const std::string& otherwise) {
    const auto at = std::find(arguments.begin(), arguments.end(), name);
    return at != arguments.end() && std::next(at) != arguments.end() ? *std::next(at) : otherwise;
  };
  lumora::Application::setIdentity("org.vantor.lumora.record-episode", "record-episode");
  if (std::find(arguments.begin(), arguments.end(), "--check-devices") != arguments.end()) {
    return checkDevices();
  }
  stage::catchInterrupts();
  try {
    recordAndSubmitAnEpisode(std::stod(option("--seconds", "6")), option("--keep", ""));
  } catch (const Failure& failure) {
    std::cerr << failure.sentence << "\n";
    return failure.status;
  } catch (const std::exception& error) {
    std::cerr << "That did not work: " << error.what() << ".\n";
    return 1;
  }
  return 0;
}
