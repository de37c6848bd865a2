#include "Movie.h"

#include "TestPicture.h"

#include <algorithm>
#include <cmath>
#include <numbers>
#include <string_view>
#include <vector>

namespace lumora::sandbox {

namespace {

// The atoms and their fields are those of Apple's QuickTime File Format Specification (2016).

constexpr std::uint32_t movieScale = 1000;
constexpr std::uint32_t framesPerSecond = 10;
constexpr std::uint32_t soundRate = 8000;
constexpr std::uint32_t bytesPerSoundSample = 2;
constexpr std::uint32_t shortest = movieScale / framesPerSecond;
constexpr std::int64_t longest = 24LL * 3600 * movieScale;

std::string number16(std::uint32_t number) {
  return {static_cast<char>(number >> 8U), static_cast<char>(number)};
}

std::string number32(std::uint32_t number) {
  return number16(number >> 16U) + number16(number);
}

std::string fixed(std::uint32_t whole) {
  return number32(whole << 16U);
}

std::string zeros(std::size_t count) {
  std::string text;
  text.resize(count);
  return text;
}

std::string atom(std::string_view type, const std::string& content) {
  constexpr std::size_t header = 8;
  return number32(static_cast<std::uint32_t>(header + content.size())) + std::string(type) + content;
}

/// An atom that begins with its version, 0, and flags.
std::string fullAtom(std::string_view type, const std::string& content, std::uint32_t flags = 0) {
  return atom(type, number32(flags) + content);
}

std::string matrix() {
  constexpr std::uint32_t one = 0x40000000;
  return fixed(1) + zeros(12) + fixed(1) + zeros(12) + number32(one);
}

std::string table(const std::vector<std::uint32_t>& numbers) {
  std::string text = number32(static_cast<std::uint32_t>(numbers.size()));
  for (const auto number : numbers) {
    text += number32(number);
  }
  return text;
}

/// What is stored, and where in the file.
struct Material {
  std::string bytes;
  std::vector<std::uint32_t> frameOffsets;
  std::vector<std::uint32_t> frameSizes;
  std::uint32_t soundOffset = 0;
};

void addFrames(Material& material, std::uint32_t begin) {
  for (std::uint32_t frame = 0; frame < framesPerSecond; ++frame) {
    const std::string png = makePNG({static_cast<int>(frame), TestPicture::Mark::Recording});
    material.frameOffsets.push_back(begin + static_cast<std::uint32_t>(material.bytes.size()));
    material.frameSizes.push_back(static_cast<std::uint32_t>(png.size()));
    material.bytes += png;
  }
}

/// One second of 440 Hz: whole waves, so that it repeats without a click.
void addSound(Material& material, std::uint32_t begin) {
  constexpr double loudness = 3000;
  constexpr double pitch = 440;
  material.soundOffset = begin + static_cast<std::uint32_t>(material.bytes.size());
  for (std::uint32_t index = 0; index < soundRate; ++index) {
    const double wave = std::sin(2 * std::numbers::pi * pitch * index / soundRate);
    const auto sample = static_cast<std::uint16_t>(std::lround(loudness * wave));
    material.bytes += {static_cast<char>(sample), static_cast<char>(sample >> 8U)};
  }
}

/// A track's sample tables and what they are measured in.
struct Track {
  std::uint32_t number;
  std::uint32_t scale;
  std::uint32_t duration;
  std::string_view kind;
  std::string mediaHeader;
  std::string sampleDescription;
  std::string sampleTables;
};

Track pictureTrack(const Material& material, std::uint32_t milliseconds) {
  const std::uint32_t count = (milliseconds + shortest - 1) / shortest;
  std::vector<std::uint32_t> sizes;
  std::vector<std::uint32_t> offsets;
  for (std::uint32_t frame = 0; frame < count; ++frame) {
    sizes.push_back(material.frameSizes.at(frame % framesPerSecond));
    offsets.push_back(material.frameOffsets.at(frame % framesPerSecond));
  }
  constexpr std::uint32_t resolution = 72;
  const std::string description =
      atom("png ", zeros(6) + number16(1) + zeros(16) + number16(TestPicture::width) + number16(TestPicture::height) +
                       fixed(resolution) + fixed(resolution) + zeros(4) + number16(1) + zeros(32) + number16(24) +
                       number16(0xFFFF));
  return {1,
          framesPerSecond,
          count,
          "vide",
          fullAtom("vmhd", zeros(8), 1),
          description,
          fullAtom("stts", number32(1) + number32(count) + number32(1)) +
              fullAtom("stsc", number32(1) + number32(1) + number32(1) + number32(1)) +
              fullAtom("stsz", number32(0) + table(sizes)) + fullAtom("stco", table(offsets))};
}

/// Every second is the same chunk; the last one may be cut short.
Track soundTrack(const Material& material, std::uint32_t milliseconds) {
  const auto samples = static_cast<std::uint32_t>(std::uint64_t{milliseconds} * soundRate / movieScale);
  const std::uint32_t whole = samples / soundRate;
  const std::uint32_t rest = samples % soundRate;
  std::vector<std::uint32_t> runs;
  if (whole > 0) {
    runs.insert(runs.end(), {1, soundRate, 1});
  }
  if (rest > 0) {
    runs.insert(runs.end(), {whole + 1, rest, 1});
  }
  std::string chunkLengths = table(runs);
  chunkLengths.replace(0, 4, number32(static_cast<std::uint32_t>(runs.size() / 3)));
  const std::vector<std::uint32_t> offsets(whole + (rest > 0 ? 1 : 0), material.soundOffset);
  const std::string description = atom("sowt", zeros(6) + number16(1) + zeros(8) + number16(1) +
                                                   number16(8 * bytesPerSoundSample) + zeros(4) + fixed(soundRate));
  return {2,
          soundRate,
          samples,
          "soun",
          fullAtom("smhd", zeros(4)),
          description,
          fullAtom("stts", number32(1) + number32(samples) + number32(1)) + fullAtom("stsc", chunkLengths) +
              fullAtom("stsz", number32(bytesPerSoundSample) + number32(samples)) + fullAtom("stco", table(offsets))};
}

std::string handler(std::string_view component, std::string_view kind) {
  return fullAtom("hdlr", std::string(component) + std::string(kind) + zeros(13));
}

std::string media(const Track& track) {
  // The file itself holds the data.
  const std::string reference = atom("dinf", fullAtom("dref", number32(1) + fullAtom("alis", "", 1)));
  const std::string samples =
      atom("stbl", fullAtom("stsd", number32(1) + track.sampleDescription) + track.sampleTables);
  return atom("mdia", fullAtom("mdhd", zeros(8) + number32(track.scale) + number32(track.duration) + zeros(4)) +
                          handler("mhlr", track.kind) +
                          atom("minf", track.mediaHeader + handler("dhlr", "alis") + reference + samples));
}

std::string description(const Track& track, std::uint32_t milliseconds) {
  constexpr std::uint32_t isEnabledAndUsed = 0xF;
  const bool isPicture = track.kind == "vide";
  const std::string header = zeros(8) + number32(track.number) + zeros(4) + number32(milliseconds) + zeros(12) +
                             number16(isPicture ? 0 : 0x100) + zeros(2) + matrix() +
                             fixed(isPicture ? TestPicture::width : 0) + fixed(isPicture ? TestPicture::height : 0);
  return atom("trak", fullAtom("tkhd", header, isEnabledAndUsed) + media(track));
}

std::string movieHeader(std::uint32_t milliseconds) {
  constexpr std::uint32_t nextTrack = 3;
  return fullAtom("mvhd", zeros(8) + number32(movieScale) + number32(milliseconds) + fixed(1) + number16(0x100) +
                              zeros(10) + matrix() + zeros(24) + number32(nextTrack));
}

} // namespace

std::string makeMovie(std::int64_t milliseconds, bool hasPicture) {
  const auto length = static_cast<std::uint32_t>(std::clamp(milliseconds, std::int64_t{shortest}, longest));
  constexpr std::uint32_t version = 0x200;
  const std::string type = atom("ftyp", "qt  " + number32(version) + "qt  ");
  const auto begin = static_cast<std::uint32_t>(type.size() + 8);

  Material material;
  std::string tracks;
  if (hasPicture) {
    addFrames(material, begin);
    tracks += description(pictureTrack(material, length), length);
  }
  addSound(material, begin);
  tracks += description(soundTrack(material, length), length);
  return type + atom("mdat", material.bytes) + atom("moov", movieHeader(length) + tracks);
}

} // namespace lumora::sandbox
