#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <atomic>
#include <mutex>
#include <string>
#include <vector>

namespace lumora::fakes {

/// A device of the fake capture system; made by FakeMediaCapture::addDevice. Any thread.
class LUMORA_EXPORT FakeCaptureDevice : public CaptureDevice {
public:
  /// A device that delivers these types; FakeMediaCapture::addDevice() makes one and lists it.
  FakeCaptureDevice(std::string uniqueID, std::vector<MediaType> types);

  std::string uniqueID() const override { return uniqueID_; }
  /// The identifier, unless it was given a name.
  std::string localizedDisplayName() const override;
  bool hasMediaType(MediaType type) const override;
  LMRErrorRef open() override;

  /// Gives it a name; that of another device may be the same.
  void setLocalizedDisplayName(std::string name);
  /// The next opens fail with this error; null lets them succeed again.
  void failToOpen(LMRErrorRef error);
  /// Sessions refuse an input of this device with this error; null lets them take it again.
  void failToBeAdded(LMRErrorRef error);

  /// How often the device was opened.
  int openCount() const;
  /// The error with which an input of this device is refused; null when none is.
  LMRErrorRef errorWhenAdded() const;

private:
  const std::string uniqueID_;
  const std::vector<MediaType> types_;
  mutable std::mutex mutex_;
  std::string name_;
  LMRErrorRef openError_;
  LMRErrorRef addError_;
  int openCount_ = 0;
};

/// A stream of a fake input. Any thread.
class LUMORA_EXPORT FakeCaptureConnection : public CaptureConnection {
public:
  /// An enabled stream of that type.
  explicit FakeCaptureConnection(MediaType type) : type_(type) {}

  MediaType mediaType() const override { return type_; }
  bool isEnabled() const override { return isEnabled_; }
  void setEnabled(bool enabled) override { isEnabled_ = enabled; }

private:
  const MediaType type_;
  std::atomic<bool> isEnabled_ = true;
};

/// An input of a device, with a connection for each kind of media that it delivers (a muxed device: video, then
/// sound), or of the screen, with one for video. Any thread.
class LUMORA_EXPORT FakeCaptureInput : public CaptureInput {
public:
  /// Of the screen when there is no device.
  explicit FakeCaptureInput(std::shared_ptr<FakeCaptureDevice> device);

  std::vector<std::shared_ptr<CaptureConnection>> connections() const override { return connections_; }
  std::shared_ptr<CaptureDevice> device() const override { return device_; }
  /// The device behind the input; null for the screen.
  const std::shared_ptr<FakeCaptureDevice>& fakeDevice() const { return device_; }

private:
  const std::shared_ptr<FakeCaptureDevice> device_;
  std::vector<std::shared_ptr<CaptureConnection>> connections_;
};

} // namespace lumora::fakes
