#pragma once

#include <LumoraKit/platform/linux/gstreamer/FileOutput.h>
#include <LumoraKit/platform/linux/gstreamer/SessionRun.h>

namespace lumora::backend {

/// The outputs of a session, for the devices' threads.
class OutputList final : public SampleSink {
public:
  void take(const CapturedSample& sample, const std::shared_ptr<Connection>& connection) override;
  void deviceFailed(const std::shared_ptr<Connection>& connection, const LMRErrorRef& error) override;

  void set(const std::vector<std::shared_ptr<FileOutput>>& outputs);

private:
  Snapshot<std::vector<std::weak_ptr<FileOutput>>> outputs_;
};

/// Inputs and outputs that run together.
class Session final : public CaptureSession {
public:
  explicit Session(std::shared_ptr<Queues> queues) : queues_(std::move(queues)) {}
  Session(const Session&) = delete;
  Session& operator=(const Session&) = delete;
  ~Session() override;

  LMRErrorRef addInput(const std::shared_ptr<CaptureInput>& input) override;
  LMRErrorRef addOutput(const std::shared_ptr<MovieFileOutput>& output) override;
  void removeOutput(const std::shared_ptr<MovieFileOutput>& output) override;
  std::vector<std::shared_ptr<CaptureInput>> inputs() const override;
  std::vector<std::shared_ptr<MovieFileOutput>> outputs() const override;

  LMRErrorRef startRunning() override;
  void stopRunning() override;
  bool isRunning() const override;

private:
  std::shared_ptr<SessionRun> makeRun();
  std::vector<std::shared_ptr<Connection>> connections() const;

  const std::shared_ptr<Queues> queues_;
  const std::shared_ptr<OutputList> outputList_ = std::make_shared<OutputList>();

  mutable std::mutex mutex_;
  std::vector<std::shared_ptr<SourceInput>> inputs_;
  std::vector<std::shared_ptr<FileOutput>> outputs_;
  std::shared_ptr<SessionRun> run_;
};

} // namespace lumora::backend
