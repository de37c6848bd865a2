#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <chrono>
#include <filesystem>
#include <optional>

namespace lumora::backend {

/// The turn of one among all threads and processes, for as long as it lives. The lock is on a file that is there for
/// nothing else, readable by the user only; it is made when it is missing, and it stays.
class LUMORA_INTERNAL FileLock {
public:
  using Time = std::chrono::steady_clock::time_point;

  /// Waits for the turn. Null on success; ETIMEDOUT when it has not come at the deadline.
  LMRErrorRef take(const std::filesystem::path& path, std::optional<Time> deadline = std::nullopt);

private:
  FileDescriptor file_;
};

} // namespace lumora::backend
