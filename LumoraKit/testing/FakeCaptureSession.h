#pragma once

#include <LumoraKit/testing/FakeCaptureDevice.h>
#include <LumoraKit/testing/FakeMovieFileOutput.h>

#include <memory>
#include <mutex>
#include <vector>

namespace lumora::fakes {

/// A session of the fake capture system; made by FakeMediaCapture::makeSession. It takes inputs of opened devices
/// while it does not run, and fake outputs at any time, each once. Any thread.
class LUMORA_EXPORT FakeCaptureSession : public CaptureSession,
                                         public std::enable_shared_from_this<FakeCaptureSession> {
public:
  FakeCaptureSession();
  ~FakeCaptureSession() override;

  LMRErrorRef addInput(const std::shared_ptr<CaptureInput>& input) override;
  LMRErrorRef addOutput(const std::shared_ptr<MovieFileOutput>& output) override;
  void removeOutput(const std::shared_ptr<MovieFileOutput>& output) override;
  std::vector<std::shared_ptr<CaptureInput>> inputs() const override;
  std::vector<std::shared_ptr<MovieFileOutput>> outputs() const override;
  LMRErrorRef startRunning() override;
  void stopRunning() override;
  bool isRunning() const override;

  /// The screen is refused with this error from now on; null lets it be added again.
  void failToAddScreenInput(LMRErrorRef error);
  /// Outputs are refused with this error from now on; null lets them be added again.
  void failToAddOutput(LMRErrorRef error);
  /// The session does not start, with this error, from now on; null lets it start again.
  void failToStart(LMRErrorRef error);

  /// Whether the device is behind one of the inputs.
  bool uses(const CaptureDevice& device) const;

private:
  mutable std::mutex mutex_;
  std::vector<std::shared_ptr<CaptureInput>> inputs_;
  std::vector<std::shared_ptr<MovieFileOutput>> outputs_;
  LMRErrorRef screenError_;
  LMRErrorRef outputError_;
  LMRErrorRef startError_;
  bool isRunning_ = false;
};

} // namespace lumora::fakes
