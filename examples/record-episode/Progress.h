#pragma once

#include "Actions.h"
#include "Report.h"
#include "Stage.h"

#include <LumoraKit/LumoraKit.h>

#include <functional>
#include <string>

namespace stage {

/// What the recorder reports, on the main thread. A delegate implements only what it wants to hear.
class Progress : public LMRDelegateImplementation<Progress> {
public:
  void recorderFailedToStartRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToPauseRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToResumeRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderFailedToStopRecording_error(const Recorder&, const LMRErrorRef& error) override { failed(error); }
  void recorderDidStopRecording(const Recorder&) override { stopped_ = true; }

  bool hasStopped() const { return stopped_; }
  /// Waits for the condition, unless the recording fails before.
  void waitFor(const LMRSourceRecorder& recorder, const std::string& what, const std::function<bool()>& condition) {
    waitUntil([&] { return failed_ || condition(); },
              [&] { return what + " " + seconds(recorder.elapsedRecordingTime()); });
    if (failed_) {
      fail("The recording failed", error_);
    }
  }

private:
  void failed(const LMRErrorRef& error) {
    failed_ = true;
    error_ = error;
  }

  bool failed_ = false;
  bool stopped_ = false;
  LMRErrorRef error_;
};

} // namespace stage
