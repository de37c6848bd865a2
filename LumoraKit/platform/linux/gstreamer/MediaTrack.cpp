#include <LumoraKit/platform/linux/gstreamer/AudioCutter.h>
#include <LumoraKit/platform/linux/gstreamer/MediaTrack.h>

#include <gst/audio/audio.h>
#include <gst/video/video.h>

#include <utility>

namespace lumora::backend {
namespace {

GstPtr<GstSample> makeSample(GstPtr<GstBuffer> buffer, GstCaps* caps, GstClockTime time, GstClockTime duration) {
  GST_BUFFER_PTS(buffer.get()) = time;
  GST_BUFFER_DTS(buffer.get()) = GST_CLOCK_TIME_NONE;
  GST_BUFFER_DURATION(buffer.get()) = duration;
  GST_BUFFER_OFFSET(buffer.get()) = GST_BUFFER_OFFSET_NONE;
  GST_BUFFER_OFFSET_END(buffer.get()) = GST_BUFFER_OFFSET_NONE;
  gst_buffer_unset_flags(buffer.get(), GST_BUFFER_FLAG_DISCONT);
  return GstPtr<GstSample>(gst_sample_new(buffer.get(), caps, nullptr, nullptr));
}

class VideoTrack final : public MediaTrack {
public:
  explicit VideoTrack(GstSample& first) { gst_video_info_from_caps(&first_, gst_sample_get_caps(&first)); }

  Samples cut(const Timeline& timeline, GstSample& sample, HostTime time) override {
    Samples result;
    if (const auto fileTime = timeline.fileTime(time)) {
      GstPtr<GstBuffer> picture(gst_buffer_copy(gst_sample_get_buffer(&sample)));
      const std::uint64_t shownAt = std::exchange(isFirst_, false) ? 0 : after(*fileTime);
      result.push_back(makeSample(std::move(picture), steadyCaps(sample), shownAt, GST_CLOCK_TIME_NONE));
    }
    return result;
  }

  GstPtr<GstSample> filler(GstSample& sample) override {
    GstPtr<GstBuffer> picture(gst_buffer_copy(gst_sample_get_buffer(&sample)));
    return makeSample(std::move(picture), steadyCaps(sample), 0, GST_CLOCK_TIME_NONE);
  }

private:
  // Two pictures never share a time: one that a pause came too late for may lie behind the first one after it.
  std::uint64_t after(std::uint64_t fileTime) {
    constexpr std::uint64_t millisecond = 1'000'000;
    next_ = std::max(fileTime, next_) + millisecond;
    return next_ - millisecond;
  }

  // A new picture size is scaled behind the source; a new frame rate would reach the muxer, which cannot take one.
  GstCaps* steadyCaps(GstSample& sample) {
    GstCaps* const caps = gst_sample_get_caps(&sample);
    if (caps != original_.get()) {
      original_.reset(gst_caps_ref(caps));
      steady_.reset(gst_caps_copy(caps));
      gst_caps_set_simple(steady_.get(), "framerate", GST_TYPE_FRACTION, first_.fps_n, first_.fps_d, nullptr);
    }
    return steady_.get();
  }

  GstVideoInfo first_{};
  // The first picture is shown from the file's beginning on, whenever it was taken: the muxer lets each track begin
  // there, and would move the whole track.
  bool isFirst_ = true;
  GstPtr<GstCaps> original_;
  GstPtr<GstCaps> steady_;
  std::uint64_t next_ = 0;
};

class SoundTrack final : public MediaTrack {
public:
  SoundTrack(const GstAudioInfo& info, std::uint32_t encoderDelay)
      : info_(info), cutter_(static_cast<std::uint32_t>(info.rate), encoderDelay) {}

  Samples cut(const Timeline& timeline, GstSample& sample, HostTime time) override {
    Samples result;
    GstBuffer* const buffer = gst_sample_get_buffer(&sample);
    GstCaps* const caps = gst_sample_get_caps(&sample);
    for (const AudioCutter::Piece& piece : cutter_.cut(timeline, time, gst_buffer_get_size(buffer) / frameSize())) {
      if (piece.silence != 0) {
        result.push_back(place(silence(piece.silence), caps, piece.position, piece.silence));
      }
      std::uint64_t position = piece.position + piece.silence;
      if (piece.repeats != 0) {
        result.push_back(place(region(*buffer, piece.first, piece.repeats), caps, position, piece.repeats));
        position += piece.repeats;
      }
      result.push_back(place(region(*buffer, piece.first, piece.count), caps, position, piece.count));
    }
    return result;
  }

  GstPtr<GstSample> filler(GstSample& sample) override {
    const std::uint64_t frames = gst_buffer_get_size(gst_sample_get_buffer(&sample)) / frameSize();
    return place(silence(frames), gst_sample_get_caps(&sample), 0, frames);
  }

private:
  gsize frameSize() const { return static_cast<gsize>(info_.bpf); }

  GstPtr<GstSample> place(GstPtr<GstBuffer> buffer, GstCaps* caps, std::uint64_t position, std::uint64_t frames) {
    return makeSample(std::move(buffer), caps, cutter_.fileTime(position), cutter_.duration(frames));
  }

  GstPtr<GstBuffer> region(GstBuffer& buffer, std::uint64_t first, std::uint64_t count) const {
    return GstPtr<GstBuffer>(
        gst_buffer_copy_region(&buffer, GST_BUFFER_COPY_ALL, first * frameSize(), count * frameSize()));
  }

  GstPtr<GstBuffer> silence(std::uint64_t frames) const {
    GstPtr<GstBuffer> buffer(gst_buffer_new_allocate(nullptr, frames * frameSize(), nullptr));
    GstMapInfo map;
    if (gst_buffer_map(buffer.get(), &map, GST_MAP_WRITE)) {
      gst_audio_format_info_fill_silence(info_.finfo, map.data, map.size);
      gst_buffer_unmap(buffer.get(), &map);
    }
    return buffer;
  }

  const GstAudioInfo info_;
  AudioCutter cutter_;
};

} // namespace

std::unique_ptr<MediaTrack> MediaTrack::make(MediaType type, GstSample& first, std::uint32_t encoderDelay) {
  if (type == MediaType::Video) {
    return std::make_unique<VideoTrack>(first);
  }
  GstAudioInfo info;
  gst_audio_info_from_caps(&info, gst_sample_get_caps(&first));
  return std::make_unique<SoundTrack>(info, encoderDelay);
}

std::uint64_t durationOf(MediaType type, GstSample& sample) {
  const GstClockTime duration = GST_BUFFER_DURATION(gst_sample_get_buffer(&sample));
  return type == MediaType::Sound && GST_CLOCK_TIME_IS_VALID(duration) ? duration : 1;
}

} // namespace lumora::backend
