#pragma once

#include <cstdint>
#include <string>

/// \file
/// Movies of a few bytes, box by box (ISO/IEC 14496-12).

namespace lumora::tests {

/// Big-endian, in so many bytes.
inline std::string number(std::uint64_t value, int bytes = 4) {
  std::string text;
  for (int shift = (bytes - 1) * 8; shift >= 0; shift -= 8) {
    text += static_cast<char>(value >> static_cast<unsigned>(shift) & 0xFFU);
  }
  return text;
}

inline std::string box(const std::string& type, const std::string& content) {
  return number(content.size() + 8) + type + content;
}

/// The same with a size of 64 bits.
inline std::string longBox(const std::string& type, const std::string& content) {
  return number(1) + type + number(content.size() + 16, 8) + content;
}

inline std::string versionAndFlags(std::uint32_t flags, std::uint32_t version = 0) {
  return number(version << 24U | flags);
}

/// "mvhd" and "mdhd" begin alike.
inline std::string timeHeader(const std::string& type, std::uint32_t timescale, std::uint32_t duration) {
  return box(type, versionAndFlags(0) + number(0) + number(0) + number(timescale) + number(duration) + number(0));
}

inline std::string track(std::uint32_t id, std::uint32_t timescale) {
  const auto header = box("tkhd", versionAndFlags(7) + number(0) + number(0) + number(id) + number(0) + number(0));
  return box("trak", header + box("mdia", timeHeader("mdhd", timescale, 0)));
}

inline std::string trackDefaults(std::uint32_t id, std::uint32_t duration, std::uint32_t size) {
  return box("trex", versionAndFlags(0) + number(id) + number(1) + number(duration) + number(size) + number(0));
}

inline std::string fileType() {
  return box("ftyp", "qt  " + number(0));
}

/// Tracks 1 and 2, of 1000 units a second; a sample of the second one is 10 units and 5 bytes unless it says otherwise.
inline std::string index() {
  return box("moov", timeHeader("mvhd", 1000, 0) + track(1, 1000) + track(2, 1000) +
                         box("mvex", trackDefaults(1, 0, 0) + trackDefaults(2, 10, 5)));
}

inline std::string beginOfTrack(std::uint32_t id, std::uint32_t time) {
  return box("tfhd", versionAndFlags(0) + number(id)) + box("tfdt", versionAndFlags(0) + number(time));
}

/// One sample of track 1.
inline std::string fragmentIndex(std::uint32_t time, std::uint32_t duration, std::uint32_t size) {
  const auto run = box("trun", versionAndFlags(0x301) + number(1) + number(0) + number(duration) + number(size));
  return box("moof", box("mfhd", versionAndFlags(0) + number(1)) + box("traf", beginOfTrack(1, time) + run));
}

inline std::string fragment(std::uint32_t time, std::uint32_t duration, const std::string& data) {
  return fragmentIndex(time, duration, static_cast<std::uint32_t>(data.size())) + box("mdat", data);
}

/// Samples of track 2, in number only.
inline std::string plainFragment(std::uint32_t time, std::uint32_t samples, const std::string& data) {
  const auto run = box("trun", versionAndFlags(0) + number(samples));
  return box("moof", box("traf", beginOfTrack(2, time) + run)) + box("mdat", data);
}

/// Two fragments, 1.6 seconds.
inline std::string movie() {
  return fileType() + index() + fragment(0, 800, "the first samples") + fragment(800, 800, "the second");
}

} // namespace lumora::tests
