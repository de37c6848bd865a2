#include <LumoraKit/platform/linux/gstreamer/BitRate.h>

#include <algorithm>

namespace lumora::backend {
namespace {

constexpr std::uint32_t soundBitRate = 128'000;
// 4 Mbit/s at 1280 x 720, in proportion to the picture otherwise.
constexpr double bitsPerPixelAndSecond = 4'000'000.0 / (1280 * 720);
constexpr std::uint32_t leastVideoBitRate = 500'000;

// 48 kHz, two channels of 16 bits.
constexpr std::uint64_t pcmBitRate = std::uint64_t{48'000} * 2 * 16;
// Two bits a pixel, 30 pictures a second: JPEG of a restless picture.
constexpr std::uint64_t jpegBitsPerPixelAndSecond = 60;

} // namespace

std::string codecOf(MediaType type, const CompressionOptions& options) {
  return options.codec.value_or(type == MediaType::Video ? "h264" : "aac");
}

PictureSize encodedSize(const CompressionOptions& options, PictureSize captured) {
  // 4:2:0 pictures have even sides.
  return {options.width.value_or(captured.width) & ~1U, options.height.value_or(captured.height) & ~1U};
}

std::uint32_t wantedBitRate(MediaType type, const CompressionOptions& options, PictureSize captured) {
  if (options.bitRate || type == MediaType::Sound) {
    return options.bitRate.value_or(soundBitRate);
  }
  const PictureSize size = encodedSize(options, captured);
  const auto fitting = static_cast<std::uint32_t>(size.width * size.height * bitsPerPixelAndSecond);
  return std::max(fitting, leastVideoBitRate);
}

std::uint64_t expectedBitRate(MediaType type, const CompressionOptions& options, PictureSize captured) {
  const std::string codec = codecOf(type, options);
  if (codec == "pcm") {
    return pcmBitRate;
  }
  if (codec == "mjpeg") {
    const PictureSize size = encodedSize(options, captured);
    return std::uint64_t{size.width} * size.height * jpegBitsPerPixelAndSecond;
  }
  return wantedBitRate(type, options, captured);
}

} // namespace lumora::backend
