#pragma once

#include <cstdint>
#include <string>

namespace lumora::sandbox {

/// What the sandbox's cameras see: colour bars with a box that moves once around in ten frames, and a mark in the
/// corner that tells the state.
struct TestPicture {
  static constexpr std::uint32_t width = 320;
  static constexpr std::uint32_t height = 180;

  enum class Mark { None, Recording, Paused };

  int frame = 0;
  Mark mark = Mark::None;
};

/// The picture as a PNG file.
std::string makePNG(const TestPicture& picture);

} // namespace lumora::sandbox
