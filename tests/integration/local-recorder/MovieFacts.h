#pragma once

#include <filesystem>

namespace lumora::tests {

/// What a player finds in a file.
struct MovieFacts {
  double seconds = 0;
  int pictureTracks = 0;
  int soundTracks = 0;
};

/// All zero when the file cannot be played. Blocks.
MovieFacts movieFacts(const std::filesystem::path& file);

} // namespace lumora::tests
