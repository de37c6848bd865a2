#include "Victim.h"

#include "support/RecordingDelegate.h"

#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/recording/LMRCaptureDeviceAdditions.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalAudioRecorder.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/recording/LMRRecordingJournal.h>
#include <LumoraKit/testing/FakePreferences.h>

#include <array>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>

#include <sys/prctl.h>

namespace {

using Recorder = std::shared_ptr<LMRLocalVideoRecorder>;
using Session = std::shared_ptr<lumora::CaptureSession>;

void recordInto(const std::filesystem::path& folder) {
  auto platform = lumora::Platform::current();
  const auto preferences = std::make_shared<lumora::fakes::FakePreferences>();
  preferences->setValue(platform.application->identifier(), LMRRecorderDestinationFolder, folder.string());
  platform.preferences = preferences;
  lumora::Platform::install(platform);
}

// Small pictures, so that the machine keeps up with what the test is not about.
Recorder prepared(Recorder recorder) {
  recorder->setVideoCompressionOptions(lumora::CompressionOptions{{}, {}, 320, 180});
  return recorder;
}

std::array<Recorder, 3> makeSources(const std::string& cameraID) {
  LMRErrorRef error;
  const auto microphone = LMRCaptureDeviceAdditions::defaultAudioCaptureDevice();
  const auto camera = lumora::Platform::current().mediaCapture->deviceWithUniqueID(cameraID);
  return {prepared(LMRLocalVideoRecorder::recorderWithCaptureSession(
              LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(microphone, camera, &error))),
          prepared(LMRLocalScreenRecorder::recorderWithCaptureSession(
              LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(nullptr, &error))),
          prepared(LMRLocalAudioRecorder::recorderWithCaptureSession(
              LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(microphone, &error)))};
}

int complain(const LMRErrorRef& error) {
  std::fprintf(stderr, "The recording does not start: %s\n", lumora::text(error).c_str());
  return EXIT_FAILURE;
}

} // namespace

int recordUntilKilled(const std::string& camera, const std::filesystem::path& folder) {
  ::prctl(PR_SET_PDEATHSIG, SIGKILL);
  recordInto(folder);
  const auto sources = makeSources(camera);
  const auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders({sources.begin(), sources.end()});
  const auto delegate = std::make_shared<lumora::tests::RecordingDelegate>();
  recorder->setDelegate(delegate);
  recorder->bootstrap();
  const auto journal = LMRRecordingJournal::journalWithFolder_error(folder / "notes", nullptr);
  auto note = LMRRecordingNote::noteWithRecorder(recorder);
  if (const auto error = journal->open(note)) {
    return complain(error);
  }
  for (const auto& source : sources) {
    if (const auto error = source->captureSession()->startRunning()) {
      return complain(error);
    }
  }
  const auto requested = lumora::Platform::current().mediaCapture->hostTime();
  recorder->start();
  auto& mainThread = *lumora::Platform::current().mainThread;
  mainThread.serveUntil([&] { return !delegate->messages().empty(); }, std::chrono::seconds(30));
  if (!recorder->isRecording()) {
    return complain(delegate->messages().empty() ? nullptr : delegate->messages().back().error);
  }
  std::printf("%llu", static_cast<unsigned long long>(requested));
  for (const auto& source : sources) {
    std::printf(" %s", source->outputFileURL()->c_str());
  }
  std::puts("");
  std::fflush(stdout);
  mainThread.serveUntil([] { return false; }, std::chrono::hours(1));
  return EXIT_FAILURE;
}
