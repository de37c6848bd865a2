#pragma once

#include <chrono>
#include <filesystem>

namespace lumora::backend {

/// Takes a file that is being written from the kernel's memory to the disk once a second, so that a power failure
/// costs no more than a crash.
class FileFlusher {
public:
  explicit FileFlusher(const std::filesystem::path& file);
  FileFlusher(const FileFlusher&) = delete;
  FileFlusher& operator=(const FileFlusher&) = delete;
  ~FileFlusher();

  void flushOnceASecond();

private:
  int descriptor_;
  std::chrono::steady_clock::time_point last_;
};

} // namespace lumora::backend
