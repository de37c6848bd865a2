#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace lumora::testing {

/// What ffprobe and ffmpeg say of a movie file.
class Movie {
public:
  /// Whether both are installed.
  static bool canBeRead();

  explicit Movie(std::filesystem::path file) : file_(std::move(file)) {}

  /// Whether every packet decodes without a complaint.
  bool decodes() const;
  /// In seconds.
  double duration() const;
  /// One value of the first stream of a type ("v" or "a"), as ffprobe prints it; empty without such a stream.
  std::string stream(const std::string& type, const std::string& entry) const;
  /// When the packets of the first stream of a type are shown, in seconds, in order.
  std::vector<double> times(const std::string& type) const;
  /// The left channel, decoded at 48 kHz, with silence where the file has none.
  std::vector<double> sound() const;
  /// The brightness (0 to 255) along the middle of the picture that is shown at a moment; empty without one.
  std::vector<std::uint8_t> middleRow(double seconds) const;

private:
  std::string probe(const std::string& arguments) const;

  std::filesystem::path file_;
};

} // namespace lumora::testing
