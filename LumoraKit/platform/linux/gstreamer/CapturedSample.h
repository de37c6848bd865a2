#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <gst/gst.h>

namespace lumora::backend {

/// A sample on its way from a device; the reference belongs to the device's pipeline.
class CapturedSample final : public SampleBuffer {
public:
  CapturedSample(GstSample& sample, HostTime time) : sample_(sample), time_(time) {}

  std::optional<HostTime> hostTime() const override { return time_; }
  std::vector<SoundLevel> soundLevels() const override;
  std::optional<Picture> picture(std::uint32_t maximumWidth, std::uint32_t maximumHeight) const override;

  HostTime time() const { return time_; }
  GstSample& sample() const { return sample_; }

private:
  GstSample& sample_;
  HostTime time_;
};

} // namespace lumora::backend
