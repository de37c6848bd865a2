#include <LumoraKit/platform/linux/gstreamer/CapturedSample.h>
#include <LumoraKit/platform/linux/gstreamer/PictureConversion.h>

#include <gst/audio/audio.h>

#include <algorithm>
#include <cmath>

namespace lumora::backend {
namespace {

constexpr double fullScale = 32768;

// A buffer that is readable for as long as this lives.
class MappedBuffer {
public:
  explicit MappedBuffer(GstBuffer* buffer)
      : buffer_(buffer), isMapped_(buffer_ && gst_buffer_map(buffer_, &map_, GST_MAP_READ) != FALSE) {}
  MappedBuffer(const MappedBuffer&) = delete;
  MappedBuffer& operator=(const MappedBuffer&) = delete;
  ~MappedBuffer() {
    if (isMapped_) {
      gst_buffer_unmap(buffer_, &map_);
    }
  }

  const std::int16_t* samples() const { return reinterpret_cast<const std::int16_t*>(map_.data); }
  std::size_t count() const { return isMapped_ ? map_.size / sizeof(std::int16_t) : 0; }

private:
  GstBuffer* buffer_;
  GstMapInfo map_ = GST_MAP_INFO_INIT;
  bool isMapped_;
};

SoundLevel levelOfChannel(const MappedBuffer& buffer, std::size_t channel, std::size_t channels) {
  double peak = 0;
  double squares = 0;
  for (std::size_t i = channel; i < buffer.count(); i += channels) {
    const double value = buffer.samples()[i] / fullScale;
    peak = std::max(peak, std::abs(value));
    squares += value * value;
  }
  const std::size_t frames = buffer.count() / channels;
  return {peak, frames > 0 ? std::sqrt(squares / static_cast<double>(frames)) : 0};
}

} // namespace

// Every microphone delivers 16-bit interleaved sound: see DeviceCatalog.
std::vector<SoundLevel> CapturedSample::soundLevels() const {
  const GstCaps* const caps = gst_sample_get_caps(&sample_);
  GstAudioInfo info;
  if (!gst_structure_has_name(gst_caps_get_structure(caps, 0), "audio/x-raw") ||
      gst_audio_info_from_caps(&info, caps) == FALSE || GST_AUDIO_INFO_FORMAT(&info) != GST_AUDIO_FORMAT_S16LE) {
    return {};
  }
  const MappedBuffer buffer(gst_sample_get_buffer(&sample_));
  const auto channels = static_cast<std::size_t>(GST_AUDIO_INFO_CHANNELS(&info));
  std::vector<SoundLevel> levels;
  for (std::size_t channel = 0; channel < channels; ++channel) {
    levels.push_back(levelOfChannel(buffer, channel, channels));
  }
  return levels;
}

std::optional<Picture> CapturedSample::picture(std::uint32_t maximumWidth, std::uint32_t maximumHeight) const {
  return convertedPicture(sample_, {maximumWidth, maximumHeight});
}

} // namespace lumora::backend
