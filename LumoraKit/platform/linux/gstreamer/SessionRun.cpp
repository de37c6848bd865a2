#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>
#include <LumoraKit/platform/linux/gstreamer/DelegateCall.h>
#include <LumoraKit/platform/linux/gstreamer/SessionRun.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>

namespace lumora::backend {
namespace {

constexpr std::chrono::seconds patience{5};
constexpr std::chrono::milliseconds watchInterval{250};

} // namespace

SessionRun::SessionRun(const std::vector<std::shared_ptr<SourceInput>>& inputs, const std::shared_ptr<SampleSink>& sink,
                       std::shared_ptr<Queues> queues)
    : queues_(std::move(queues)) {
  for (const auto& input : inputs) {
    pipelines_.push_back(std::make_shared<DevicePipeline>(input, sink, queues_));
  }
}

LMRErrorRef SessionRun::start() {
  const Deadline deadline = std::chrono::steady_clock::now() + patience;
  if (LMRErrorRef error = startDevices(deadline)) {
    stopDevices(deadline);
    return error;
  }
  started_ = true;
  startOnWorker(*queues_, [self = shared_from_this()] { self->watch(); });
  return nullptr;
}

LMRErrorRef SessionRun::startDevices(Deadline deadline) {
  std::vector<std::future<LMRErrorRef>> outcomes;
  for (const auto& pipeline : pipelines_) {
    outcomes.push_back(startOnWorker(*queues_, [pipeline] { return pipeline->start(); }));
  }
  LMRErrorRef error;
  for (std::size_t i = 0; i < outcomes.size() && !error; ++i) {
    if (outcomes[i].wait_until(deadline) == std::future_status::ready) {
      error = outcomes[i].get();
    } else {
      error = captureError(CaptureErrorCode::DeviceTimedOut,
                           format("%@ did not start within 5 seconds", {pipelines_[i]->name()}));
    }
  }
  return error;
}

void SessionRun::stop() {
  {
    const std::lock_guard lock(mutex_);
    stopped_ = true;
  }
  changed_.notify_all();
  stopDevices(std::chrono::steady_clock::now() + patience);
}

void SessionRun::stopDevices(Deadline deadline) {
  std::vector<std::future<void>> outcomes;
  for (const auto& pipeline : pipelines_) {
    outcomes.push_back(startOnWorker(*queues_, [pipeline] { pipeline->stop(); }));
  }
  if (DelegateCall::isCurrent()) {
    return;
  }
  for (std::size_t i = 0; i < outcomes.size(); ++i) {
    if (outcomes[i].wait_until(deadline) != std::future_status::ready) {
      log("Capture: %@ does not stop", {pipelines_[i]->name()});
    }
  }
}

void SessionRun::watch() {
  std::unique_lock lock(mutex_);
  while (!changed_.wait_for(lock, watchInterval, [this] { return stopped_; })) {
    lock.unlock();
    for (const auto& pipeline : pipelines_) {
      pipeline->checkForSilence();
    }
    lock.lock();
  }
}

} // namespace lumora::backend
