#pragma once

#include <LumoraKit/platform/linux/gstreamer/Connection.h>
#include <LumoraKit/platform/linux/gstreamer/DeviceCatalog.h>

namespace lumora::backend {

/// A camera or microphone. It is looked up again whenever it is opened or used, so that it may come and go.
class GStreamerDevice final : public CaptureDevice, public std::enable_shared_from_this<GStreamerDevice> {
public:
  GStreamerDevice(const ListedDevice& device, std::shared_ptr<DeviceCatalog> catalog, std::shared_ptr<Queues> queues);

  std::string uniqueID() const override { return uniqueID_; }
  std::string localizedDisplayName() const override { return name_; }
  bool hasMediaType(MediaType type) const override { return type == type_; }
  LMRErrorRef open() override;

  bool isOpen() const { return open_; }
  MediaType mediaType() const { return type_; }
  /// A new source for a pipeline; its element is null on failure.
  CaptureSource makeSource(LMRErrorRef& error) const;

private:
  LMRErrorRef tryOut() const;

  const std::string uniqueID_;
  const std::string name_;
  const MediaType type_;
  const std::shared_ptr<DeviceCatalog> catalog_;
  const std::shared_ptr<Queues> queues_;
  std::atomic<bool> open_{false};
};

/// An input with one connection.
class SourceInput : public CaptureInput {
public:
  explicit SourceInput(MediaType type) : connection_(std::make_shared<Connection>(type)) {}

  std::vector<std::shared_ptr<CaptureConnection>> connections() const final { return {connection_}; }
  const std::shared_ptr<Connection>& connection() const { return connection_; }

  /// For messages about it.
  virtual std::string name() const = 0;
  /// Whether a session can take it; null if so.
  virtual LMRErrorRef check() const = 0;
  /// A new source for a pipeline. May block for 4 seconds.
  virtual CaptureSource makeSource(LMRErrorRef& error) const = 0;
  /// Gives up what makeSource() has begun and not yet delivered.
  virtual void withdraw() {}

private:
  const std::shared_ptr<Connection> connection_;
};

/// The input of an opened device.
class DeviceInput final : public SourceInput {
public:
  explicit DeviceInput(std::shared_ptr<GStreamerDevice> device);

  std::shared_ptr<CaptureDevice> device() const override { return device_; }
  std::string name() const override { return device_->localizedDisplayName(); }
  LMRErrorRef check() const override;
  CaptureSource makeSource(LMRErrorRef& error) const override { return device_->makeSource(error); }

private:
  const std::shared_ptr<GStreamerDevice> device_;
};

/// The main screen, as an X server shows it, 30 times a second.
class ScreenInput final : public SourceInput {
public:
  ScreenInput() : SourceInput(MediaType::Video) {}

  std::shared_ptr<CaptureDevice> device() const override { return nullptr; }
  std::string name() const override;
  LMRErrorRef check() const override;
  CaptureSource makeSource(LMRErrorRef& error) const override;
};

} // namespace lumora::backend
