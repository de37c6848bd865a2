#pragma once

#include <optional>
#include <string>
#include <vector>

namespace lumora::tests {

/// What an independent reader finds in a movie.
struct MovieProbe {
  /// Of the tracks, in their order.
  std::vector<std::string> codecs;
  /// Frames and sound samples by the track's own count.
  std::vector<long> sampleCounts;
  /// Of the movie, in seconds.
  double duration = 0;
  /// What the reader complained of while it decoded everything.
  std::string complaints;
};

/// Whether ffprobe and ffmpeg are installed.
bool canProbeMovies();
/// A file that cannot be read gives an empty probe with a complaint.
MovieProbe probeMovie(const std::string& path);

} // namespace lumora::tests

/// Declares a probe of the movie, free of complaints.
#define LUMORA_PROBE_OR_SKIP(probe, path)                                                                              \
  if (!lumora::tests::canProbeMovies()) {                                                                              \
    GTEST_SKIP() << "ffprobe and ffmpeg are not installed";                                                            \
  }                                                                                                                    \
  const auto probe = lumora::tests::probeMovie(path);                                                                  \
  ASSERT_EQ(probe.complaints, "")
