#pragma once

#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/platform/linux/gstreamer/CapturedSample.h>
#include <LumoraKit/platform/linux/gstreamer/Inputs.h>
#include <LumoraKit/platform/linux/gstreamer/XServerLoss.h>

#include <gst/app/gstappsink.h>

#include <condition_variable>

namespace lumora::backend {

/// Takes what the devices of a session deliver.
class SampleSink {
public:
  virtual ~SampleSink() = default;
  /// On the device's thread, for every sample of an enabled connection.
  virtual void take(const CapturedSample& sample, const std::shared_ptr<Connection>& connection) = 0;
  /// On a worker, once: the device gives no more samples.
  virtual void deviceFailed(const std::shared_ptr<Connection>& connection, const LMRErrorRef& error) = 0;
};

/// One run of one device: its pipeline, from the start to the end of a session's running. All pipelines run on the
/// system clock, so that samples of all devices carry times of one clock. Any thread, except as noted.
class DevicePipeline : public std::enable_shared_from_this<DevicePipeline> {
public:
  DevicePipeline(std::shared_ptr<SourceInput> input, std::shared_ptr<SampleSink> sink, std::shared_ptr<Queues> queues);
  DevicePipeline(const DevicePipeline&) = delete;
  DevicePipeline& operator=(const DevicePipeline&) = delete;
  ~DevicePipeline();

  /// Starts the device and waits for its first sample, at most 2 seconds from the moment it runs. Blocks for as long
  /// as the device takes to open: for a worker. Null on success.
  LMRErrorRef start();
  /// Blocks until the device has stopped: for a worker. A start that has not ended yet ends without success.
  void stop();

  /// Fails the device when it gave no sample for 2 seconds.
  void checkForSilence();

  std::string name() const { return input_->name(); }

private:
  LMRErrorRef build();
  void link(GstElement& queue, GstElement& sink);
  void observe(GstElement& queue, GstElement& sink);
  LMRErrorRef play();
  LMRErrorRef awaitFirstSample();
  LMRErrorRef silenceError() const;
  void fail(const LMRErrorRef& error);
  void deviceMoved();
  GstStateChangeReturn setState(GstState state);
  void threadChanged(GstMessage& message);
  XServerLoss::Observer serverLost();

  GstFlowReturn pull(GstAppSink& sink);
  HostTime timeOf(GstSample& sample) const;
  void noteArrival(GstSample& sample);

  static GstFlowReturn newSample(GstAppSink* sink, gpointer self);
  static GstBusSyncReply busMessage(GstBus* bus, GstMessage* message, gpointer pipeline);

  const std::shared_ptr<SourceInput> input_;
  const std::shared_ptr<Connection> connection_;
  const std::shared_ptr<SampleSink> sink_;
  const std::shared_ptr<Queues> queues_;
  CaptureSource source_;
  GstPtr<GstElement> pipeline_;

  // Held while the pipeline's state changes.
  std::mutex stateMutex_;
  std::atomic<bool> stopping_{false};
  // Its thread has stopped for good, so its state cannot be changed any more.
  std::atomic<bool> stuck_{false};

  std::atomic<HostTime> lastArrival_{0};
  std::atomic<unsigned> lost_{0};
  std::atomic<bool> failed_{false};
  std::mutex mutex_;
  std::condition_variable changed_;
  bool firstSampleCame_ = false;
  LMRErrorRef error_;
};

} // namespace lumora::backend
