#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <limits>
#include <optional>
#include <vector>

namespace lumora::backend {

/// Where moments of the host clock fall in a recording's file: the time since the start, without the pauses.
/// Pure arithmetic; not thread safe.
class LUMORA_INTERNAL Timeline {
public:
  /// A stretch of host time that is in the file; `end` is not part of it.
  struct Span {
    HostTime begin;
    HostTime end;
    /// Of `begin`, in nanoseconds.
    std::uint64_t fileTime;
    /// How often the recording was resumed before.
    std::size_t resumes;
  };

  explicit Timeline(HostTime start);

  /// The sample at this moment is the first that is left out. Without effect when paused or stopped.
  void pause(HostTime time);
  /// The sample at this moment is the first that is taken again. Without effect unless paused.
  void resume(HostTime time);
  /// Nothing from this moment on is in the file. Only the first stop counts.
  void stop(HostTime time);

  HostTime start() const { return sections_.front().begin; }
  /// Nothing while the recording goes on.
  std::optional<HostTime> stopTime() const { return stopTime_; }
  bool isPaused() const { return paused_; }

  /// The file time of a moment; nothing when it is not in the file.
  std::optional<std::uint64_t> fileTime(HostTime time) const;
  /// The parts of [begin, end) that are in the file, in order.
  std::vector<Span> spans(HostTime begin, HostTime end) const;

private:
  static constexpr HostTime open = std::numeric_limits<HostTime>::max();

  void close(HostTime time);

  // What is recorded between start, pauses, resumes and stop; the last one is open unless paused or stopped.
  std::vector<Span> sections_;
  std::optional<HostTime> stopTime_;
  bool paused_ = false;
};

} // namespace lumora::backend
