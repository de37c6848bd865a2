#pragma once

#include <LumoraKit/platform/linux/gstreamer/Timeline.h>

namespace lumora::backend {

/// Cuts captured sound to a recording's timeline, exactly to the frame, and counts the frames of the file, so that
/// the file's sound has neither gaps nor overlaps however the devices' time stamps jitter. A device that counts faster
/// or slower than the host's clock is followed, one frame at a time. Not thread safe.
class LUMORA_INTERNAL AudioCutter {
public:
  /// Frames of a captured buffer that go into the file.
  struct Piece {
    /// Frames of silence to write before them.
    std::uint64_t silence;
    /// How often to write the first one before them all: 1 where a slow device is followed, else 0.
    std::uint64_t repeats;
    /// Index of the first one in the buffer, and how many.
    std::uint64_t first;
    std::uint64_t count;
    /// Number in the file of the first frame of all that, the silence included.
    std::uint64_t position;
  };

  /// `encoderDelay`: frames by which the encoder delays the sound. The sound is moved forward by as much, which costs
  /// the file its first frames.
  AudioCutter(std::uint32_t rate, std::uint32_t encoderDelay);

  /// The pieces of a buffer of `frames` whose first frame was captured at `begin`.
  std::vector<Piece> cut(const Timeline& timeline, HostTime begin, std::uint64_t frames);

  /// The time in the file of a frame, in nanoseconds.
  std::uint64_t fileTime(std::uint64_t position) const;
  /// The time that so many frames last, in nanoseconds.
  std::uint64_t duration(std::uint64_t frames) const { return fileTime(frames); }

private:
  std::uint64_t framesIn(std::uint64_t nanoseconds) const;
  // What comes between the file's last frame and a piece: silence, the piece's first frame once more, or less of it.
  struct Join {
    std::uint64_t silence;
    std::uint64_t repeats;
    std::uint64_t skipped;
  };

  std::int64_t toleranceIn(const Timeline::Span& span) const;
  std::optional<Piece> place(const Timeline::Span& span, HostTime begin, std::uint64_t frames);
  Join join(const Timeline::Span& span);
  Join slip(std::int64_t behind);

  std::uint32_t rate_;
  std::uint64_t encoderDelay_;
  std::uint64_t written_ = 0;
  // In frames, smoothed: how far the file is behind the time stamps.
  double behind_ = 0;
  // The section of the timeline that the last piece was in.
  std::optional<std::size_t> section_;
};

} // namespace lumora::backend
