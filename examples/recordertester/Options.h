#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace tester {

/// What the command line asks for.
struct Options {
  bool list = false;
  /// Each CAMERA or CAMERA+MICROPHONE.
  std::vector<std::string> cameras;
  std::vector<std::string> microphones;
  /// Whether the screen is recorded, and with which microphone.
  bool screen = false;
  std::string screenMicrophone;
  double seconds = 10;
  /// In seconds of recorded time, ascending.
  std::vector<double> pauses;
  double pauseLength = 1;
  std::filesystem::path folder = ".";
};

/// Nothing when the program is to end with the status in `status`: help was asked for, or the arguments are wrong and
/// that was said.
std::optional<Options> parse(int argc, const char* const* argv, int& status);

} // namespace tester
