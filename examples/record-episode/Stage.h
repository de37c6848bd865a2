#pragma once

#include <chrono>
#include <filesystem>
#include <functional>
#include <string>

/// \file
/// What the tutorial needs around it and an application already has: a place to write to, and a loop that serves the
/// main thread.

namespace stage {

/// Ends the program: a plain sentence for the user, and the exit status.
struct Failure {
  std::string sentence;
  int status = 1;
};

/// Everything that the program writes (settings, recordings, the server) goes into one temporary folder, which is
/// gone when this object is.
class TemporaryHome {
public:
  TemporaryHome();
  TemporaryHome(const TemporaryHome&) = delete;
  TemporaryHome& operator=(const TemporaryHome&) = delete;
  ~TemporaryHome();

  const std::filesystem::path& path() const { return path_; }

private:
  std::filesystem::path path_;
};

/// From now on Ctrl-C ends a wait with a Failure, in place of the process.
void catchInterrupts();

/// Serves the main thread until the condition holds, and shows a line of progress meanwhile. A Failure on Ctrl-C, or
/// when the time is over.
void waitUntil(const std::function<bool()>& condition, const std::function<std::string()>& progress,
               std::chrono::seconds limit = std::chrono::seconds(30));

} // namespace stage
