// Records an episode from a camera with a microphone, the screen and a remote camera as one recording, and submits it
// to a server: the whole road that a recording application goes, from the login to the finished episode.

#include "Actions.h"
#include "Progress.h"
#include "Report.h"
#include "Server.h"
#include "Stage.h"

#include <LumoraKit/LumoraKit.h>

#include <algorithm>
#include <cstdlib>
#include <iostream>

namespace {

using stage::Failure;
using stage::listed;
using stage::Progress;
using stage::runAction;
using stage::waitUntil;

// 1. Log in. The session that comes out of it goes with every later operation.
std::shared_ptr<LMRSession> logIn(const std::string& user, const std::string& password) {
  const auto login = LMRAuthenticationAction::actionWithServer_port_userName_password("localhost", 0, user, password);
  runAction(login);
  std::cout << "Logged in to " << login->session()->description() << " as "
            << login->session()->userFullName().value_or(user) << ".\n";
  return login->session();
}

// 2. Learn what the server does with recordings, and pick a workflow that takes as many sources as we have.
std::string chooseWorkflow(const std::shared_ptr<LMRSession>& session, std::size_t sources) {
  for (const auto& workflow : listed(LMRActionFactory::actionToListWorkflowsWithSession(session), LMRWorkflowsKey)) {
    const lumora::Array* const taken = workflow.array(LMRWorkflowSourcesKey);
    if (taken && taken->size() == sources) {
      std::cout << "Workflow: " << workflow.string(LMRWorkflowTitleKey).value_or("") << ".\n";
      return workflow.string(LMRWorkflowUUIDKey).value_or("");
    }
  }
  throw Failure{"The server has no workflow that takes " + std::to_string(sources) + " sources."};
}

// What is recorded: the recorder and, for the user, its name.
struct Source {
  std::shared_ptr<LMRSourceRecorder> recorder;
  std::string name;
};
using Sources = std::vector<Source>;

// 3. Open the devices. A session runs from here on, as it would for a preview.
void run(const std::shared_ptr<lumora::CaptureSession>& session, const std::string& what, const LMRErrorRef& error) {
  if (!session) {
    stage::fail(what + " could not be opened", error);
  }
  if (const LMRErrorRef refused = session->startRunning()) {
    stage::fail(what + " could not be started", refused);
  }
}

Source openCamera() {
  const auto microphone = LMRCaptureDeviceAdditions::defaultAudioCaptureDevice();
  const auto camera = LMRCaptureDeviceAdditions::defaultVideoCaptureDevice();
  LMRErrorRef error;
  const auto session =
      LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(microphone, camera, &error);
  run(session, "Camera and microphone", error);
  return {LMRLocalVideoRecorder::recorderWithCaptureSession(session),
          camera->localizedDisplayName() + " with " + microphone->localizedDisplayName()};
}

Source openScreen() {
  LMRErrorRef error;
  const auto session = LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(nullptr, &error);
  run(session, "The screen", error);
  return {LMRLocalScreenRecorder::recorderWithCaptureSession(session), "Screen"};
}

// A remote camera records at the server's side; here it is a name.
Source chooseRemoteCamera(const std::shared_ptr<LMRSession>& session) {
  const auto cameras = listed(LMRActionFactory::actionToListRemoteCamerasWithSession(session), LMRCamerasKey);
  if (cameras.empty()) {
    throw Failure{"The server has no remote camera."};
  }
  const std::string name = cameras.front().string(LMRCameraNameKey).value_or("");
  return {LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(name, session), "Remote camera " + name};
}

// 4. Record all sources as one, with a pause in the middle. Each request is made once, to the whole; what came of it
// is told once, when it holds for every source.
stage::Beginnings record(LMRMultipleSourceRecorder& recorder, Progress& progress, double seconds) {
  recorder.start();
  progress.waitFor(recorder, "Starting", [&] { return recorder.isRecording(); });
  stage::Beginnings beginnings(recorder.sourceRecorders());
  progress.waitFor(recorder, "Recording", [&] { return recorder.elapsedRecordingTime() >= seconds / 2; });
  recorder.pause();
  progress.waitFor(recorder, "Pausing", [&] { return recorder.isPaused(); });
  const auto pausedUntil = std::chrono::steady_clock::now() + std::chrono::seconds(1);
  progress.waitFor(recorder, "Paused", [&] { return std::chrono::steady_clock::now() >= pausedUntil; });
  recorder.resume();
  progress.waitFor(recorder, "Recording", [&] { return recorder.elapsedRecordingTime() >= seconds; });
  // Makes a container for the parts on the server, gives each source its place in it, and stops them all.
  recorder.stop();
  progress.waitFor(recorder, "Finishing", [&] { return progress.hasStopped(); });
  std::cout << "Recorded " << recorder.sourceRecorders().size() << " sources for "
            << stage::seconds(recorder.elapsedRecordingTime()) << ", with a pause.\n";
  return beginnings;
}

// Ctrl-C, or a source that failed. After a failure the sources are no longer listened to, so each is cancelled by
// itself: the files go, and the remote camera throws its recording away.
void cancel(const Sources& sources) {
  for (const Source& source : sources) {
    const bool records = source.recorder->isRecording() || source.recorder->isPaused();
    source.recorder->cancel();
    if (records && source.recorder->isRemote() && !source.recorder->isCancelled()) {
      std::cerr << source.name << " could not be cancelled.\n";
    }
  }
  waitUntil(
      [&] {
        return std::none_of(sources.begin(), sources.end(), [](const Source& source) {
          const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(source.recorder);
          return local && local->movieFileOutput()->outputFileURL();
        });
      },
      [] { return "Cancelling"; });
}

stage::Beginnings recordEpisode(const Sources& sources, const std::string& workflowUUID,
                                const lumora::Dictionary& userMetadata, const std::shared_ptr<LMRSession>& session,
                                double seconds) {
  LMRMultipleSourceRecorder::Recorders recorders;
  std::transform(sources.begin(), sources.end(), std::back_inserter(recorders),
                 [](const Source& source) { return source.recorder; });
  const auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders(recorders);
  const auto progress = std::make_shared<Progress>();
  recorder->setWorkflowUUID(workflowUUID);
  recorder->setSession(session);
  recorder->setMetadata(userMetadata);
  recorder->setDelegate(progress);
  recorder->bootstrap();
  try {
    return record(*recorder, *progress, seconds);
  } catch (const Failure&) {
    cancel(sources);
    throw;
  }
}

// 5. Hand each local file to its place in the recording, with what the user says about it and what the recorder
// knows. The remote camera's part is at the server already.
void submit(LMRLocalVideoRecorder& recorder, const lumora::Dictionary& userMetadata,
            const std::shared_ptr<LMRSession>& session) {
  const auto date = [](const std::optional<lumora::WallTime>& time) {
    return std::chrono::floor<std::chrono::seconds>(time.value_or(lumora::WallTime()));
  };
  const lumora::Dictionary recordingMetadata = {
      {std::string(LMREpisodeRecordingMetadataStartDateKey), date(recorder.recordingStartDate())},
      {std::string(LMREpisodeRecordingMetadataStopDateKey), date(recorder.recordingStopDate())},
      {std::string(LMREpisodeRecordingMetadataDurationKey), recorder.elapsedRecordingTime()},
  };
  const bool asynchronous = false;
  const bool deleteAfterSubmission = true;
  runAction(
      LMRActionFactory::
          actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
              recorder.outputFileURL()->string(), recorder.submissionUUID(), userMetadata, recordingMetadata,
              asynchronous, deleteAfterSubmission, session));
  recorder.setIsSubmitted(true);
}

// 6. The whole road. `keptMovies`: where copies of the stored movies go.
void recordAndSubmitAnEpisode(double seconds, const std::string& keptMovies) {
  const std::string user = "ada";
  const std::string password = lumora::makeUUIDString();
  const stage::TemporaryHome home;
  const stage::Server server(home.path() / "server", user, password);
  const lumora::Dictionary userMetadata = {
      {std::string(LMREpisodeUserMetadataTitleKey), "Waves and tones"},
      {std::string(LMREpisodeUserMetadataDescriptionKey), "Recorded by the tutorial."},
  };
  const auto session = logIn(user, password);
  const Sources sources = {openCamera(), openScreen(), chooseRemoteCamera(session)};
  const std::string workflow = chooseWorkflow(session, sources.size());
  const auto beginnings = recordEpisode(sources, workflow, userMetadata, session, seconds);
  for (const Source& source : sources) {
    if (const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(source.recorder)) {
      submit(*local, userMetadata, session);
    }
  }
  std::vector<std::string> names;
  std::transform(sources.begin(), sources.end(), std::back_inserter(names),
                 [](const Source& source) { return source.name; });
  stage::printEpisode(server, names, beginnings);
  server.keepMovies(keptMovies);
}

double numberIn(const std::string& text) {
  char* end = nullptr;
  const double number = std::strtod(text.c_str(), &end);
  if (text.empty() || *end != '\0' || !(number > 0)) {
    throw Failure{"\"" + text + "\" is no number of seconds.", 2};
  }
  return number;
}

// 0 when the machine has what the episode is recorded with.
int checkDevices() {
  LMRErrorRef error;
  const bool found = LMRCaptureDeviceAdditions::defaultAudioCaptureDevice() &&
                     LMRCaptureDeviceAdditions::defaultVideoCaptureDevice() &&
                     LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(nullptr, &error);
  return found ? 0 : 1;
}

} // namespace

// record-episode [--seconds N] [--keep FOLDER] | --check-devices
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
    recordAndSubmitAnEpisode(numberIn(option("--seconds", "6")), option("--keep", ""));
  } catch (const Failure& failure) {
    std::cerr << failure.sentence << "\n";
    return failure.status;
  } catch (const std::exception& error) {
    std::cerr << "That did not work: " << error.what() << ".\n";
    return 1;
  }
  return 0;
}
