#pragma once

#include <LumoraKit/platform/MediaCapture.h>

namespace lumora::backend {

struct PictureSize {
  std::uint32_t width;
  std::uint32_t height;
};

/// The codec that the options name, or else the framework's choice.
std::string codecOf(MediaType type, const CompressionOptions& options);

/// The size of the pictures in the file, for pictures of a size.
PictureSize encodedSize(const CompressionOptions& options, PictureSize captured);

/// What an encoder is told to make, in bits a second. Those without a bit rate to set ("mjpeg", "pcm") ignore it.
std::uint32_t wantedBitRate(MediaType type, const CompressionOptions& options, PictureSize captured);

/// What a track will take, in bits a second.
std::uint64_t expectedBitRate(MediaType type, const CompressionOptions& options, PictureSize captured);

} // namespace lumora::backend
