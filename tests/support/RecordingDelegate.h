#pragma once

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <functional>
#include <mutex>
#include <string>
#include <vector>

namespace lumora::tests {

/// A delegate that implements all ten messages and keeps what it was told.
class RecordingDelegate : public LMRDelegateImplementation<RecordingDelegate> {
public:
  struct Message {
    std::string selector;
    const LMRSourceRecorder* recorder;
    LMRErrorRef error;
    bool wasOnMainThread;
  };

  /// Called with each message, after it was kept.
  std::function<void(const std::string& selector)> onMessage = [](const std::string&) {};

  std::vector<Message> messages() const {
    const std::lock_guard lock(mutex_);
    return messages_;
  }
  std::vector<std::string> selectors() const {
    std::vector<std::string> all;
    for (const auto& message : messages()) {
      all.push_back(message.selector);
    }
    return all;
  }

  void recorderDidStartRecording(const Recorder& recorder) override { keep("recorderDidStartRecording:", recorder); }
  void recorderFailedToStartRecording_error(const Recorder& recorder, const LMRErrorRef& error) override {
    keep("recorderFailedToStartRecording:error:", recorder, error);
  }
  void recorderDidPauseRecording(const Recorder& recorder) override { keep("recorderDidPauseRecording:", recorder); }
  void recorderFailedToPauseRecording_error(const Recorder& recorder, const LMRErrorRef& error) override {
    keep("recorderFailedToPauseRecording:error:", recorder, error);
  }
  void recorderDidResumeRecording(const Recorder& recorder) override { keep("recorderDidResumeRecording:", recorder); }
  void recorderFailedToResumeRecording_error(const Recorder& recorder, const LMRErrorRef& error) override {
    keep("recorderFailedToResumeRecording:error:", recorder, error);
  }
  void recorderDidStopRecording(const Recorder& recorder) override { keep("recorderDidStopRecording:", recorder); }
  void recorderFailedToStopRecording_error(const Recorder& recorder, const LMRErrorRef& error) override {
    keep("recorderFailedToStopRecording:error:", recorder, error);
  }
  void recorderDidCancelRecording(const Recorder& recorder) override { keep("recorderDidCancelRecording:", recorder); }
  void recorderFailedToCancelRecording_error(const Recorder& recorder, const LMRErrorRef& error) override {
    keep("recorderFailedToCancelRecording:error:", recorder, error);
  }

private:
  void keep(const std::string& selector, const Recorder& recorder, const LMRErrorRef& error = nullptr) {
    {
      const std::lock_guard lock(mutex_);
      messages_.push_back({selector, recorder.get(), error, Platform::current().mainThread->isCurrent()});
    }
    onMessage(selector);
  }

  mutable std::mutex mutex_;
  std::vector<Message> messages_;
};

} // namespace lumora::tests
