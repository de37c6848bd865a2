#pragma once

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace lumora {
class Dictionary;
class ToolRunner;
} // namespace lumora

namespace stage {

/// A sandbox server, to which every tool run of this process goes: with one user, the remote camera "Studio A" and the
/// workflow "Lecture hall", which takes a camera, a screen and another camera.
class Server {
public:
  Server(std::filesystem::path root, const std::string& user, const std::string& password);

  /// The server's own record of what was submitted: of each source of the recording its episode, in their order.
  std::vector<lumora::Dictionary> episodes() const;
  /// What a movie file holds, read back from the file: a line a track with codec, format and duration.
  std::vector<std::string> mediaFacts(const std::filesystem::path& movie) const;
  /// Copies the movies of the episodes into a folder; none when its name is empty.
  void keepMovies(const std::filesystem::path& folder) const;

private:
  std::string sandbox(const std::vector<std::string>& arguments, const std::string& input = {}) const;
  std::string run(const std::string& program, const std::vector<std::string>& arguments,
                  const std::string& input) const;

  std::filesystem::path root_;
  std::shared_ptr<lumora::ToolRunner> machine_;
};

} // namespace stage
