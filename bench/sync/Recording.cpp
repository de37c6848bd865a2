#include "Recording.h"

#include "Generator.h"

#include <LumoraKit/LumoraKit.h>

#include <chrono>
#include <cstdio>

namespace lumora::bench {
namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;
using Session = std::shared_ptr<CaptureSession>;

constexpr int pauses = 3;

class Failures : public LMRDelegateImplementation<Failures> {
public:
  void recorderFailedToStartRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToPauseRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToResumeRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToStopRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderDidStopRecording(const Recorder&) override { hasStopped = true; }

  bool hasStopped = false;
  bool hasFailed = false;

private:
  void failed(const LMRErrorRef& error) {
    hasFailed = true;
    std::fprintf(stderr, "The recording failed: %s\n", error ? error->localizedDescription().c_str() : "no reason");
  }
};

std::shared_ptr<CaptureDevice> awaitDevice(const std::string& uniqueID) {
  MediaCapture& capture = *Platform::current().mediaCapture;
  for (const auto deadline = Clock::now() + 10s; Clock::now() < deadline;) {
    if (auto device = capture.deviceWithUniqueID(uniqueID)) {
      return device;
    }
  }
  return nullptr;
}

// Null with a line on the error output.
Session openSession(const std::vector<std::string>& devices, bool withScreen) {
  MediaCapture& capture = *Platform::current().mediaCapture;
  const Session session = capture.makeSession();
  LMRErrorRef error = withScreen ? session->addInput(capture.makeScreenInput()) : nullptr;
  for (const std::string& uniqueID : devices) {
    const auto device = awaitDevice(uniqueID);
    if (!device) {
      std::fprintf(stderr, "There is no %s\n", uniqueID.c_str());
      return nullptr;
    }
    error = error ? error : device->open();
    error = error ? error : session->addInput(capture.makeDeviceInput(device));
  }
  error = error ? error : session->startRunning();
  if (error) {
    std::fprintf(stderr, "%s\n", error->localizedDescription().c_str());
  }
  return error ? nullptr : session;
}

class Run {
public:
  Run(LMRMultipleSourceRecorder& recorder, Failures& failures) : recorder_(recorder), failures_(failures) {}

  bool perform(double seconds) {
    recorder_.start();
    bool good = wait([this] { return recorder_.isRecording(); });
    const auto section = std::chrono::duration<double>(seconds / (pauses + 2));
    for (int pause = 0; good && pause < pauses; ++pause) {
      // Of no length that fits the cameras' interval or the light's.
      good = rest(section) && pauseFor(section / pauses + (pause + 1) * 7.7ms);
    }
    good = good && rest(section);
    recorder_.stop();
    return wait([this] { return failures_.hasStopped; }) && good;
  }

private:
  bool wait(const std::function<bool()>& condition) {
    Platform::current().mainThread->serveUntil([&] { return failures_.hasFailed || condition(); }, 20s);
    return !failures_.hasFailed && condition();
  }

  bool rest(std::chrono::duration<double> time) {
    const auto end = Clock::now() + std::chrono::duration_cast<Clock::duration>(time);
    while (!failures_.hasFailed && Clock::now() < end) {
      Platform::current().mainThread->serveUntil([&] { return failures_.hasFailed || Clock::now() >= end; }, 1s);
    }
    return !failures_.hasFailed;
  }

  bool pauseFor(std::chrono::duration<double> time) {
    recorder_.pause();
    const bool good = wait([this] { return recorder_.isPaused(); }) && rest(time);
    recorder_.resume();
    return wait([this] { return recorder_.isRecording(); }) && good;
  }

  LMRMultipleSourceRecorder& recorder_;
  Failures& failures_;
};

struct Source {
  std::string name;
  std::shared_ptr<LMRLocalVideoRecorder> recorder;
};

std::vector<Source> openSources() {
  const std::string left = std::string("video:") + leftCamera;
  const std::string right = std::string("video:") + rightCamera;
  const std::string microphone = "audio:lumora_microphone";
  const Session leftSession = openSession({left, microphone}, false);
  const Session rightSession = openSession({right}, false);
  const Session screenSession = openSession({}, true);
  const Session soundSession = openSession({microphone}, false);
  if (!leftSession || !rightSession || !screenSession || !soundSession) {
    return {};
  }
  return {{"camera 1 with microphone", LMRLocalVideoRecorder::recorderWithCaptureSession(leftSession)},
          {"camera 2", LMRLocalVideoRecorder::recorderWithCaptureSession(rightSession)},
          {"screen", LMRLocalScreenRecorder::recorderWithCaptureSession(screenSession)},
          {"microphone", LMRLocalAudioRecorder::recorderWithCaptureSession(soundSession)}};
}

} // namespace

std::vector<RecordedFile> record(const std::filesystem::path& folder, double seconds) {
  // By this name the framework knows that a stop needs no server.
  Application::setIdentity("org.vantor.lumora.recordertester", "bench-sync");
  const std::vector<Source> sources = openSources();
  if (sources.empty()) {
    return {};
  }
  LMRMultipleSourceRecorder::Recorders recorders;
  for (const Source& source : sources) {
    recorders.push_back(source.recorder);
  }
  const auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders(recorders);
  const auto failures = std::make_shared<Failures>();
  recorder->setDelegate(failures);
  recorder->bootstrap();
  for (std::size_t i = 0; i < sources.size(); ++i) {
    sources[i].recorder->setOutputFileURL(folder / (std::to_string(i + 1) + ".mov"));
  }
  if (!Run(*recorder, *failures).perform(seconds)) {
    return {};
  }
  std::vector<RecordedFile> files;
  for (const Source& source : sources) {
    files.push_back({source.name, *source.recorder->outputFileURL(), source.recorder->hostTimesOfFile(),
                     source.name != "microphone"});
  }
  return files;
}

} // namespace lumora::bench
