#pragma once

#include <LumoraKit/testing/FakeCaptureErrors.h>
#include <LumoraKit/testing/FakeCaptureSession.h>

#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace lumora::fakes {

/// A whole capture system without a device: cameras and microphones that the test adds and takes away, sessions,
/// outputs that are driven by hand (see FakeMovieFileOutput), and a host clock that stands still until it is set.
///
///     auto capture = std::make_shared<FakeMediaCapture>();
///     capture->addDevice("camera", {MediaType::Video});
///     capture->addDevice("microphone", {MediaType::Sound});
///
/// Keeps what it makes. Any thread.
class LUMORA_EXPORT FakeMediaCapture : public MediaCapture {
public:
  FakeMediaCapture();
  ~FakeMediaCapture() override;

  /// The first device of that type, unless another one was chosen.
  std::shared_ptr<CaptureDevice> defaultInputDevice(MediaType type) override;
  /// In the order of their addition.
  std::vector<std::shared_ptr<CaptureDevice>> inputDevices(MediaType type) override;
  std::shared_ptr<CaptureDevice> deviceWithUniqueID(const std::string& uniqueID) override;
  std::shared_ptr<CaptureInput> makeDeviceInput(const std::shared_ptr<CaptureDevice>& device) override;
  std::shared_ptr<CaptureInput> makeScreenInput() override;
  std::shared_ptr<CaptureSession> makeSession() override;
  std::shared_ptr<MovieFileOutput> makeMovieFileOutput() override;
  HostTime hostTime() const override;
  /// Those that were set, for any codec.
  std::vector<MediaEncoder> encoders(const std::string& codec) override;

  /// Plugs a device in that delivers these types. The first one of a type is its default device.
  std::shared_ptr<FakeCaptureDevice> addDevice(std::string uniqueID, std::vector<MediaType> types);
  /// Makes a device the default one of a type; null: there is none.
  void setDefaultInputDevice(MediaType type, std::shared_ptr<FakeCaptureDevice> device);
  /// Unplugs a device: it is listed no more, and a recording in progress in a session that uses it ends with an
  /// error.
  void loseDevice(const std::string& uniqueID);

  /// Sessions made from now on refuse the screen with this error; null lets them succeed again. For one session only,
  /// ask that session.
  void failToAddScreenInput(LMRErrorRef error);
  /// The same for any output.
  void failToAddOutput(LMRErrorRef error);
  /// The same for the start of the session.
  void failToStart(LMRErrorRef error);

  /// The encoders that work from now on; at first none.
  void setEncoders(std::vector<MediaEncoder> encoders);

  /// Sets the clock, in either direction.
  void setHostTime(HostTime time);
  /// Sets the clock forward; the new time.
  HostTime advanceHostTime(HostTime ticks);

  /// The sessions that were made, in their order.
  std::vector<std::shared_ptr<FakeCaptureSession>> sessions() const;
  /// The outputs that were made, in their order.
  std::vector<std::shared_ptr<FakeMovieFileOutput>> movieFileOutputs() const;

private:
  mutable std::mutex mutex_;
  std::vector<std::shared_ptr<FakeCaptureDevice>> devices_;
  std::map<MediaType, std::shared_ptr<FakeCaptureDevice>> defaults_;
  std::vector<std::shared_ptr<FakeCaptureSession>> sessions_;
  std::vector<std::shared_ptr<FakeMovieFileOutput>> outputs_;
  LMRErrorRef screenError_;
  LMRErrorRef outputError_;
  LMRErrorRef startError_;
  std::vector<MediaEncoder> encoders_;
  HostTime hostTime_ = 0;
};

} // namespace lumora::fakes
