#pragma once

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/linux/gstreamer/Encoders.h>
#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>

#include <gst/app/gstappsrc.h>

#include <filesystem>

namespace lumora::backend {

/// What one track of a file is made from.
struct TrackFormat {
  const Encoder* encoder;
  CompressionOptions options;
  /// Of the samples that come in first.
  GstPtr<GstCaps> caps;
};

/// The pipeline that encodes, muxes and writes one movie file: one source of samples a track. Independent of the
/// devices, so that whatever happens to the file does not touch them. Used by one thread, except as noted.
class RecordingPipeline {
public:
  RecordingPipeline(const std::filesystem::path& file, const std::vector<TrackFormat>& tracks);
  RecordingPipeline(const RecordingPipeline&) = delete;
  RecordingPipeline& operator=(const RecordingPipeline&) = delete;
  ~RecordingPipeline();

  /// Makes the file. Null on success; may block.
  LMRErrorRef start();

  /// Any thread; never block.
  void push(std::size_t track, GstSample& sample);
  void endOfStream(std::size_t track);
  /// Bytes that the encoder has not taken yet.
  std::uint64_t waitingBytes(std::size_t track) const;

  /// How it ended.
  struct Outcome {
    LMRErrorRef error;
  };
  /// Waits for the end of the file: nothing when it has not come.
  std::optional<Outcome> awaitEnd(std::chrono::milliseconds limit);

private:
  LMRErrorRef errorOnBus();

  GstPtr<GError> parseError_;
  GstPtr<GstElement> pipeline_;
  GstPtr<GstBus> bus_;
  std::vector<GstPtr<GstElement>> sources_;
};

} // namespace lumora::backend
