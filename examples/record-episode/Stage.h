#pragma once

#include <chrono>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace lumora {
class ToolRunner;
}

/// \file
/// What the tutorial needs around it and an application already has: a place to write to, a server to talk to, and a
/// loop that serves the main thread.

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

/// A sandbox server with one user, to which every tool run of this process goes.
class Server {
public:
  Server(std::filesystem::path root, const std::string& user, const std::string& password);

  /// The server's own record of what was submitted, as text.
  std::string episodes() const;
  /// The movie files that it stores.
  std::vector<std::filesystem::path> storedMovies() const;
  /// What a movie file holds, read back from the file: a line a track with codec, format and duration.
  std::vector<std::string> mediaFacts(const std::filesystem::path& movie) const;

private:
  std::string run(const std::string& program, const std::vector<std::string>& arguments,
                  const std::string& input = {}) const;

  std::filesystem::path root_;
  std::shared_ptr<lumora::ToolRunner> machine_;
};

/// From now on Ctrl-C ends a wait with a Failure, in place of the process.
void catchInterrupts();

/// Serves the main thread until the condition holds, and shows a line of progress meanwhile. A Failure on Ctrl-C, or
/// when the time is over.
void waitUntil(const std::function<bool()>& condition, const std::function<std::string()>& progress,
               std::chrono::seconds limit = std::chrono::seconds(30));

} // namespace stage
