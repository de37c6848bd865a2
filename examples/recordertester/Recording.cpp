#include "Recording.h"

#include "Devices.h"

#include <algorithm>
#include <csignal>
#include <functional>
#include <iomanip>
#include <iostream>

#include <unistd.h>

namespace tester {
namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

volatile std::sig_atomic_t interrupted = 0;

// What the recorder reports. "Did" messages need no handling: the states tell.
class Outcome : public LMRDelegateImplementation<Outcome> {
public:
  void recorderFailedToStartRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToPauseRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToResumeRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToStopRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderDidStopRecording(const Recorder&) override { hasStopped = true; }

  bool hasStopped = false;
  bool hasFailed = false;
  std::string reason = "Nothing was recorded.";

private:
  void failed(const LMRErrorRef& error) {
    hasFailed = true;
    reason = error ? error->localizedDescription() + "." : reason;
  }
};

// A line that a terminal writes over; elsewhere it would only be noise.
void show(const std::string& what, double seconds) {
  if (isatty(STDERR_FILENO) != 0) {
    std::cerr << "\r\033[K" << what << " " << std::fixed << std::setprecision(1) << seconds << " s" << std::flush;
  }
}

void hideLine() {
  if (isatty(STDERR_FILENO) != 0) {
    std::cerr << "\r\033[K" << std::flush;
  }
}

class Run {
public:
  Run(const std::vector<Source>& sources, const Options& options) : sources_(sources), options_(options) {
    LMRMultipleSourceRecorder::Recorders recorders;
    std::transform(sources.begin(), sources.end(), std::back_inserter(recorders),
                   [](const Source& source) { return source.recorder; });
    recorder_ = LMRMultipleSourceRecorder::recorderWithSourceRecorders(recorders);
    recorder_->setDelegate(outcome_);
  }

  void perform() {
    recorder_->bootstrap();
    nameFiles(sources_, options_.folder);
    recorder_->start();
    wait("Starting", [this] { return recorder_->isRecording(); });
    for (const double pause : options_.pauses) {
      recordUntil(pause);
      pauseFor(options_.pauseLength);
    }
    recordUntil(options_.seconds);
    stop();
    hideLine();
    if (outcome_->hasFailed) {
      throw Failure{outcome_->reason};
    }
  }

private:
  // Ends early on Ctrl-C and on a failure.
  void wait(const char* what, const std::function<bool()>& condition) {
    while (!isOver() && !lumora::Platform::current().mainThread->serveUntil(condition, 100ms)) {
      show(what, recorder_->elapsedRecordingTime());
    }
  }

  bool isOver() const { return interrupted != 0 || outcome_->hasFailed; }

  void recordUntil(double seconds) {
    wait("Recording", [this, seconds] { return recorder_->elapsedRecordingTime() >= seconds; });
  }

  void pauseFor(double seconds) {
    if (isOver()) {
      return;
    }
    recorder_->pause();
    wait("Pausing", [this] { return recorder_->isPaused(); });
    const auto end = Clock::now() + std::chrono::duration<double>(seconds);
    wait("Paused", [end] { return Clock::now() >= end; });
    if (!isOver()) {
      recorder_->resume();
      wait("Resuming", [this] { return recorder_->isRecording(); });
    }
  }

  // In this application a stop asks no server. After a failure nobody tells of the sources' ends, but their outputs do.
  void stop() {
    recorder_->stop();
    const auto deadline = Clock::now() + 20s;
    const auto hasEnded = [](const Source& source) { return !source.recorder->movieFileOutput()->outputFileURL(); };
    while (!std::all_of(sources_.begin(), sources_.end(), hasEnded) && Clock::now() < deadline) {
      lumora::Platform::current().mainThread->serveUntil([this] { return outcome_->hasStopped; }, 100ms);
      show("Finishing", recorder_->elapsedRecordingTime());
    }
  }

  const std::vector<Source>& sources_;
  const Options& options_;
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_;
  const std::shared_ptr<Outcome> outcome_ = std::make_shared<Outcome>();
};

} // namespace

void catchInterrupts() {
  struct sigaction action {};
  action.sa_handler = [](int) { interrupted = 1; };
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    sigaction(signal, &action, nullptr);
  }
}

void record(const std::vector<Source>& sources, const Options& options) {
  Run(sources, options).perform();
}

} // namespace tester
