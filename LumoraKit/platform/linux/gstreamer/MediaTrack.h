#pragma once

#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>
#include <LumoraKit/platform/linux/gstreamer/Timeline.h>

namespace lumora::backend {

/// Turns captured samples into samples of one track of a file: cut to the timeline, with the file's times, and in a
/// format that never changes. Not thread safe.
class MediaTrack {
public:
  using Samples = std::vector<GstPtr<GstSample>>;

  /// For a track whose first sample is `first`. `encoderDelay` is in frames of sound.
  static std::unique_ptr<MediaTrack> make(MediaType type, GstSample& first, std::uint32_t encoderDelay);

  virtual ~MediaTrack() = default;
  virtual Samples cut(const Timeline& timeline, GstSample& sample, HostTime time) = 0;
  /// What goes at the beginning of a track that would be empty: an empty track makes the whole file unreadable. A
  /// picture, or a little silence.
  virtual GstPtr<GstSample> filler(GstSample& sample) = 0;
};

/// How long a sample lasts, in nanoseconds; 1 for a picture, which is a moment.
std::uint64_t durationOf(MediaType type, GstSample& sample);

} // namespace lumora::backend
