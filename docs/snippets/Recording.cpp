// The examples about recording.

#include <LumoraKit/LumoraKit.h>

#include <any>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace snippets {

using lumora::Platform;

class Controller : public LMRDelegateImplementation<Controller> {
public:
  void recorderDidStopRecording(const Recorder& recorder) override;
  void recorderFailedToStopRecording_error(const Recorder& recorder, const LMRErrorRef& error) override;
};

// LMRSourceRecorderDelegate.h
namespace brief {
class Controller : public LMRDelegateImplementation<Controller> {
public:
  void recorderDidStopRecording(const Recorder& recorder) override;
};
} // namespace brief

void oneLocalRecording(const std::shared_ptr<Controller>& controller) {
  LMRErrorRef error;
  auto session = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
      LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), LMRCaptureDeviceAdditions::defaultVideoCaptureDevice(),
      &error); // null: `error` says why
  auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(session);
  recorder->setDelegate(controller); // held weakly
  recorder->bootstrap();             // adds the output, chooses the file
  error = session->startRunning();   // the devices run: a preview can be shown
  recorder->start();
  // Recording.
  recorder->stop(); // or cancel()
}

// LMRLocalVideoRecorder.h
void cameraAndMicrophone(const std::shared_ptr<Controller>& controller) {
  LMRErrorRef error;
  auto session = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
      LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), LMRCaptureDeviceAdditions::defaultVideoCaptureDevice(),
      &error);
  auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(session);
  recorder->setDelegate(controller);
  recorder->bootstrap();
  session->startRunning();
  recorder->start();
}

void microphone() {
  LMRErrorRef error;
  auto session = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(
      LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), &error);
  auto recorder = LMRLocalAudioRecorder::recorderWithCaptureSession(session);
}

void screen() {
  LMRErrorRef error;
  auto session = LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(
      LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), &error);
  auto recorder = LMRLocalScreenRecorder::recorderWithCaptureSession(session);
}

void remoteCamera(const std::shared_ptr<LMRSession>& session, const std::shared_ptr<Controller>& controller) {
  auto recorder = LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session("Studio A", session);
  recorder->setDelegate(controller);
  recorder->setWorkflow("single-video");
  recorder->setMetadata(lumora::Dictionary{{"Title", "Lecture 1"}});
  recorder->startWithDelay(5);
  // Recording.
  recorder->stop();
}

// LMRRemoteVideoRecorder.h
void remoteCameraAtOnce(const std::shared_ptr<LMRSession>& session, const std::shared_ptr<Controller>& controller) {
  auto recorder = LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session("Studio A", session);
  recorder->setDelegate(controller);
  recorder->setWorkflow("single-video");
  recorder->start();
  // Recording.
  recorder->stop();
}

void severalSources(const std::shared_ptr<LMRLocalVideoRecorder>& camera,
                    const std::shared_ptr<LMRSourceRecorder>& screen, const std::shared_ptr<LMRSourceRecorder>& studio,
                    const std::string& uuid, const std::shared_ptr<LMRSession>& session,
                    const std::shared_ptr<Controller>& controller, const lumora::Dictionary& recordingMetadata) {
  auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders({camera, screen, studio});
  recorder->setWorkflowUUID(uuid); // of a workflow with as many sources
  recorder->setSession(session);
  recorder->setMetadata(lumora::Dictionary{{"Title", "Lecture 1"}});
  recorder->setDelegate(controller); // of the recorder; its sources have the recorder as theirs
  recorder->bootstrap();
  recorder->start();
  // Recording.
  recorder->stop(); // recorderDidStopRecording: every file is finished
  // now submit each local file into its own submission
  LMRActionFactory::
      actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
          camera->outputFileURL()->string(), camera->submissionUUID(), recorder->metadata(), recordingMetadata, true,
          false, session);
}

// LMRSourceRecorder.h
void anyRecorder(const std::shared_ptr<LMRSourceRecorder>& recorder, const std::shared_ptr<Controller>& controller) {
  recorder->setDelegate(controller);
  recorder->bootstrap();
  recorder->start();
  // Recording.
  recorder->stop();
}

void finishWhatIsLeft(const std::shared_ptr<LMRMultipleSourceRecorder>& recorder,
                      const std::shared_ptr<Controller>& controller) {
  for (const auto& source : recorder->sourceRecorders()) {
    if (source->isRecording() || source->isPaused()) {
      source->setDelegate(controller); // the recorder is its delegate no more
      source->stop();                  // null error at once: the one that was lost, its file is finished
    }
  }
}

class Window {
public:
  void watchTheDisk(const std::shared_ptr<LMRSourceRecorder>& recorder);
  void watchTheDiskAndSay(const std::shared_ptr<LMRSourceRecorder>& recorder);

private:
  void show(double secondsLeft);
  lumora::Connection lowSpace_;
};

void Window::watchTheDisk(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  auto watch = LMRDiskSpaceWatch::watchWithRecorder(recorder);
  watch->setLowWaterMark(1'000'000'000); // 500 MB unless set
  recorder->bootstrap();                 // from now on the folders are known
  for (const LMRDiskSpace& space : watch->forecast()) {
    show(space.secondsLeft());
  }
  lowSpace_ = Platform::current().notificationCenter->observe(LMRDiskSpaceIsLowNotification,
                                                              [this](const std::any&) { show(0); });
  watch->start(); // looks every second; the notice comes on the main thread
}

// LMRDiskSpaceWatch.h
void Window::watchTheDiskAndSay(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  auto watch = LMRDiskSpaceWatch::watchWithRecorder(recorder);
  recorder->bootstrap();
  for (const LMRDiskSpace& space : watch->forecast()) {
    show(space.secondsLeft());
  }
  lowSpace_ = lumora::Platform::current().notificationCenter->observe(
      LMRDiskSpaceIsLowNotification, [this](const std::any& object) {
        const auto& space = std::any_cast<const LMRDiskSpace&>(object);
        show(space.secondsLeft());
      });
  watch->start();
  recorder->start();
}

struct Bar {
  void set(double decibels);
};

struct Warning {
  void setVisible(bool visible);
};

// LMRLevelMeter.h
void showLevels(const std::shared_ptr<lumora::CaptureSession>& session, Bar* bar, Warning* warning) {
  LMRErrorRef error;
  auto meter = LMRLevelMeter::meterWithCaptureSession_error(session, &error);
  // Twenty times a second:
  for (const lumora::SoundLevel& level : meter->takeLevels()) {
    bar->set(LMRLevelMeter::decibels(level.peak));
  }
  warning->setVisible(meter->secondsOfSilence() > 10);
}

struct Image {
  void show(const std::vector<std::uint8_t>& rgb, std::uint32_t width, std::uint32_t height);
};

// LMRVideoPreview.h
void showPictures(const std::shared_ptr<lumora::CaptureSession>& session, Image* image) {
  LMRErrorRef error;
  auto preview = LMRVideoPreview::previewWithCaptureSession_error(session, &error);
  // Some times a second:
  if (const auto picture = preview->takePicture(320, 180)) {
    image->show(picture->rgb, picture->width, picture->height);
  }
}

// LMRRecorderClasses.h
void archive(const std::shared_ptr<LMRLocalVideoRecorder>& recorder, std::string* kept) {
  const auto archive = lumora::KeyedArchiver::archivedData(*recorder);
  *kept = archive;
}

std::shared_ptr<LMRSourceRecorder> unarchived(const std::string& archive) {
  LMRErrorRef error;
  auto object = lumora::KeyedUnarchiver::unarchivedObject(archive, LMRRecorderClasses(), &error);
  auto recorder = std::dynamic_pointer_cast<LMRSourceRecorder>(object);
  return recorder;
}

} // namespace snippets
