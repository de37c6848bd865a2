// The recorder as its movie-file output's delegate: it acts on samples and reports what became of the file.
#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>

#include <algorithm>

namespace {

// A file does not begin earlier before its first sample: that of a recorder which was started long before its session
// would begin with nothing.
constexpr lumora::HostTime longestLead = 200'000'000;

lumora::WallTime now() {
  return lumora::Platform::current().wallClock->now();
}

bool hasOutput(const lumora::CaptureSession& session, const std::shared_ptr<lumora::MovieFileOutput>& output) {
  const auto outputs = session.outputs();
  return std::find(outputs.begin(), outputs.end(), output) != outputs.end();
}

} // namespace

std::optional<lumora::HostTime> LMRLocalVideoRecorder::PendingHostTime::get() const {
  const auto time = time_.load();
  return time == none ? std::nullopt : std::optional(time);
}

std::optional<lumora::HostTime> LMRLocalVideoRecorder::PendingHostTime::takeBefore(lumora::HostTime sample) {
  const auto time = time_.load();
  return time != none && time < sample ? take(time) : std::nullopt;
}

std::optional<lumora::HostTime> LMRLocalVideoRecorder::PendingHostTime::takeUpTo(lumora::HostTime sample) {
  const auto time = time_.load();
  return time != none && time <= sample ? take(time) : std::nullopt;
}

// Only the request that was looked at: one that was made meanwhile waits for its own sample.
std::optional<lumora::HostTime> LMRLocalVideoRecorder::PendingHostTime::take(lumora::HostTime time) {
  auto expected = time;
  return time_.compare_exchange_strong(expected, none) ? std::optional(time) : std::nullopt;
}

// Runs for every sample: with nothing pending it must stay a matter of three loads.
void LMRLocalVideoRecorder::captureOutput_didOutputSampleBuffer_fromConnection(lumora::MovieFileOutput&,
                                                                               const lumora::SampleBuffer& sampleBuffer,
                                                                               lumora::CaptureConnection&) {
  if (hostTimeToStart_.isSet() || hostTimeToPause_.isSet() || hostTimeToResume_.isSet()) [[unlikely]] {
    actOnSample(sampleBuffer);
  }
}

// One action a sample. The start wants a later sample than its request, pause and resume take one of the same time.
void LMRLocalVideoRecorder::actOnSample(const lumora::SampleBuffer& sampleBuffer) {
  const auto sampleTime = sampleBuffer.hostTime();
  if (!sampleTime) {
    return;
  }
  const std::lock_guard lock(actionMutex_);
  if (const auto start = hostTimeToStart_.takeBefore(*sampleTime)) {
    const auto file = outputFileURL();
    lumora::log("Recording new test podcast episode (by calling -recordToOutputFileURL:) at %@",
                {file ? lumora::text(*file) : "(null)"});
    beginFile(std::max(*start, *sampleTime - std::min(*sampleTime, longestLead)));
  } else if (const auto pause = hostTimeToPause_.takeUpTo(*sampleTime)) {
    pauseFile(*pause);
  } else if (const auto resume = hostTimeToResume_.takeUpTo(*sampleTime)) {
    resumeFile(*resume);
  }
}

void LMRLocalVideoRecorder::beginFile(lumora::HostTime time) {
  const auto file = outputFileURL();
  if (!file) {
    movieFileOutput()->recordToOutputFileURL(std::nullopt);
    return;
  }
  noteHostTime(time, hostTimesOfFile().empty());
  movieFileOutput()->recordToOutputFileURL_atHostTime(*file, time);
}

void LMRLocalVideoRecorder::pauseFile(lumora::HostTime time) {
  noteHostTime(time, hostTimesOfFile().size() % 2 == 1);
  movieFileOutput()->pauseRecordingAtHostTime(time);
}

void LMRLocalVideoRecorder::resumeFile(lumora::HostTime time) {
  const auto count = hostTimesOfFile().size();
  noteHostTime(time, count != 0 && count % 2 == 0);
  movieFileOutput()->resumeRecordingAtHostTime(time);
}

// A request that changes nothing (a second pause, a second start) leaves no mark.
void LMRLocalVideoRecorder::noteHostTime(lumora::HostTime time, bool hasEffect) {
  if (hasEffect) {
    auto times = hostTimesOfFile();
    times.push_back(time);
    hostTimesOfFile_.set(std::move(times));
  }
}

void LMRLocalVideoRecorder::captureOutput_didStartRecordingToOutputFileAtURL_forConnections(
    const std::shared_ptr<lumora::MovieFileOutput>&, const std::filesystem::path&, const Connections&) {
  recordingStartDate_.set(now());
  didStartRecording();
}

void LMRLocalVideoRecorder::captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(
    const std::shared_ptr<lumora::MovieFileOutput>&, const std::filesystem::path&, const Connections&) {
  didPauseRecording();
}

void LMRLocalVideoRecorder::captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(
    const std::shared_ptr<lumora::MovieFileOutput>&, const std::filesystem::path&, const Connections&) {
  didResumeRecording();
}

void LMRLocalVideoRecorder::captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(
    const std::shared_ptr<lumora::MovieFileOutput>&, const std::filesystem::path& file, const Connections&,
    const LMRErrorRef& error) {
  if (error) {
    lumora::log("Will finish recording to: %@, error: %@", {lumora::text(file), lumora::text(error)});
  } else {
    lumora::log("Will finish recording to: %@", {lumora::text(file)});
  }
}

void LMRLocalVideoRecorder::captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(
    const std::shared_ptr<lumora::MovieFileOutput>& output, const std::filesystem::path& file, const Connections&,
    const LMRErrorRef& error) {
  if (error) {
    lumora::log("%s, error: %@", {"-[LMRLocalVideoRecorder captureOutput:didFinishRecordingToOutputFileAtURL:"
                                  "forConnections:dueToError:]",
                                  lumora::text(error)});
  }
  recordingStopDate_.set(now());
  const auto session = captureSession();
  if (session && hasOutput(*session, output)) {
    session->removeOutput(output);
  }
  reportFinish(file, error);
}

// A file that ended with an error stays where it is.
void LMRLocalVideoRecorder::reportFinish(const std::filesystem::path& file, const LMRErrorRef& error) {
  if (!deleteMovieFileWhenItFinishesRecording_) {
    error ? failedToStopRecordingWithError(error) : didStopRecording();
    return;
  }
  const auto failure = error ? error : lumora::Platform::current().files->removeFile(file);
  failure ? failedToCancelRecordingWithError(failure) : didCancelRecording();
}
