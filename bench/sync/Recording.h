#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <filesystem>
#include <string>
#include <vector>

namespace lumora::bench {

/// What one source recorded.
struct RecordedFile {
  std::string name;
  std::filesystem::path path;
  /// When the file began, was paused, went on, ...
  std::vector<HostTime> moments;
  bool hasPictures = true;
};

/// Records two cameras (the first with the microphone), the screen and the microphone as one recording of about that
/// many seconds, with three pauses. The first file is the first camera's. Nothing, with a line on the error output,
/// when that fails.
std::vector<RecordedFile> record(const std::filesystem::path& folder, double seconds);

} // namespace lumora::bench
