#pragma once

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/Property.h>
#include <LumoraKit/platform/linux/gstreamer/BitRate.h>

#include <atomic>

namespace lumora::backend {

/// The one stream of an input.
class Connection final : public CaptureConnection {
public:
  explicit Connection(MediaType type) : type_(type) {}

  MediaType mediaType() const override { return type_; }
  bool isEnabled() const override { return enabled_.load(std::memory_order_relaxed); }
  void setEnabled(bool enabled) override { enabled_.store(enabled, std::memory_order_relaxed); }

  /// Of the pictures that it delivers, or, as long as it has not delivered any, is likely to.
  PictureSize pictureSize() const { return pictureSize_.get(); }
  void setPictureSize(PictureSize size) { pictureSize_.set(size); }

  /// Why the device gives no samples any more; null while it does.
  LMRErrorRef failure() const { return failure_.get(); }
  void setFailure(LMRErrorRef error) { failure_.set(std::move(error)); }

private:
  const MediaType type_;
  std::atomic<bool> enabled_{true};
  Property<LMRErrorRef> failure_;
  Property<PictureSize> pictureSize_{PictureSize{1280, 720}};
};

} // namespace lumora::backend
