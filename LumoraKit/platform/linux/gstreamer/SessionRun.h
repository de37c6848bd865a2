#pragma once

#include <LumoraKit/platform/linux/gstreamer/DevicePipeline.h>

#include <chrono>

namespace lumora::backend {

/// One time of a session's running: a pipeline for each input, and the watch over them.
class SessionRun : public std::enable_shared_from_this<SessionRun> {
public:
  SessionRun(const std::vector<std::shared_ptr<SourceInput>>& inputs, const std::shared_ptr<SampleSink>& sink,
             std::shared_ptr<Queues> queues);

  /// Starts all devices at once and waits for the first sample of each. Blocks for 5 seconds at most. Null on success;
  /// otherwise nothing runs.
  LMRErrorRef start();
  bool isStarted() const { return started_; }
  /// Stops all devices; waits for them for 5 seconds at most, and not inside a message to a delegate.
  void stop();

private:
  using Deadline = std::chrono::steady_clock::time_point;

  LMRErrorRef startDevices(Deadline deadline);
  void stopDevices(Deadline deadline);
  void watch();

  const std::shared_ptr<Queues> queues_;
  std::vector<std::shared_ptr<DevicePipeline>> pipelines_;
  std::atomic<bool> started_{false};
  std::mutex mutex_;
  std::condition_variable changed_;
  bool stopped_ = false;
};

} // namespace lumora::backend
