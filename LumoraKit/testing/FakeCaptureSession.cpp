#include <LumoraKit/testing/FakeCaptureErrors.h>
#include <LumoraKit/testing/FakeCaptureSession.h>

#include <algorithm>

namespace lumora::fakes {
namespace {

template <class T> bool contains(const std::vector<std::shared_ptr<T>>& all, const std::shared_ptr<T>& one) {
  return std::find(all.begin(), all.end(), one) != all.end();
}

// Why a device's input is refused; null when it is not.
LMRErrorRef refusal(const FakeCaptureDevice& device) {
  if (auto error = device.errorWhenAdded()) {
    return error;
  }
  return device.openCount() == 0 ? captureError(CaptureErrorCode::NotPossible, "The device is not open") : nullptr;
}

} // namespace

FakeCaptureSession::FakeCaptureSession() = default;
FakeCaptureSession::~FakeCaptureSession() = default;

LMRErrorRef FakeCaptureSession::addInput(const std::shared_ptr<CaptureInput>& input) {
  const auto device = std::static_pointer_cast<FakeCaptureInput>(input)->fakeDevice();
  const std::lock_guard lock(mutex_);
  if (auto error = device ? refusal(*device) : screenError_) {
    return error;
  }
  if (isRunning_ || contains(inputs_, input)) {
    return captureError(CaptureErrorCode::NotPossible, "The session runs, or has the input already");
  }
  inputs_.push_back(input);
  return nullptr;
}

LMRErrorRef FakeCaptureSession::addOutput(const std::shared_ptr<MovieFileOutput>& output) {
  const std::lock_guard lock(mutex_);
  if (outputError_) {
    return outputError_;
  }
  if (!std::static_pointer_cast<FakeMovieFileOutput>(output)->attachTo(weak_from_this())) {
    return captureError(CaptureErrorCode::NotPossible, "The output is in a session");
  }
  outputs_.push_back(output);
  return nullptr;
}

void FakeCaptureSession::removeOutput(const std::shared_ptr<MovieFileOutput>& output) {
  const std::lock_guard lock(mutex_);
  if (contains(outputs_, output)) {
    std::erase(outputs_, output);
    std::static_pointer_cast<FakeMovieFileOutput>(output)->detach();
  }
}

std::vector<std::shared_ptr<CaptureInput>> FakeCaptureSession::inputs() const {
  const std::lock_guard lock(mutex_);
  return inputs_;
}

std::vector<std::shared_ptr<MovieFileOutput>> FakeCaptureSession::outputs() const {
  const std::lock_guard lock(mutex_);
  return outputs_;
}

LMRErrorRef FakeCaptureSession::startRunning() {
  const std::lock_guard lock(mutex_);
  isRunning_ = !startError_;
  return startError_;
}

// The outputs are asked without the lock: they ask back for the connections.
void FakeCaptureSession::stopRunning() {
  {
    const std::lock_guard lock(mutex_);
    isRunning_ = false;
  }
  for (const auto& output : outputs()) {
    output->recordToOutputFileURL(std::nullopt);
  }
}

bool FakeCaptureSession::isRunning() const {
  const std::lock_guard lock(mutex_);
  return isRunning_;
}

void FakeCaptureSession::failToAddScreenInput(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  screenError_ = std::move(error);
}

void FakeCaptureSession::failToAddOutput(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  outputError_ = std::move(error);
}

void FakeCaptureSession::failToStart(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  startError_ = std::move(error);
}

bool FakeCaptureSession::uses(const CaptureDevice& device) const {
  const auto all = inputs();
  return std::any_of(all.begin(), all.end(), [&](const auto& input) { return input->device().get() == &device; });
}

} // namespace lumora::fakes
