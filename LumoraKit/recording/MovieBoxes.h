#pragma once

#include <LumoraKit/platform/Export.h>

#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <string_view>

/// \file
/// The boxes of a movie file (ISO/IEC 14496-12; QuickTime calls them atoms), as far as is needed to say how much of a
/// fragmented movie is whole. Whatever the bytes are, nothing here reads beyond them, loops or fails otherwise.

namespace lumora {

/// The longest header of a box: size, type, and a size of 64 bits.
inline constexpr std::size_t longestBoxHeader = 16;

struct LUMORA_INTERNAL MovieBoxHeader {
  /// Four characters, such as "moof".
  std::string type;
  std::uint64_t headerSize = 0;
  /// With the header. 0: the box goes on to the end of the file.
  std::uint64_t size = 0;
};

/// The header that these bytes begin with; nothing when they are too few, when the type is not printable, or when the
/// size is smaller than the header.
LUMORA_INTERNAL std::optional<MovieBoxHeader> movieBoxHeader(std::string_view bytes);

/// What the fragments of one track refer to.
struct LUMORA_INTERNAL MovieTrack {
  /// Units in a second.
  std::uint32_t timescale = 0;
  std::uint32_t defaultDuration = 0;
  std::uint32_t defaultSize = 0;
  /// Where the fragments read so far end, in units.
  std::uint64_t end = 0;

  double endInSeconds() const;
};

/// What a "moov" box says.
struct LUMORA_INTERNAL MovieIndex {
  std::map<std::uint32_t, MovieTrack> tracks;
  /// Whether the samples are in fragments ("mvex" is there).
  bool isFragmented = false;
  /// Of the movie's own header, in seconds.
  double duration = 0;

  /// The longest of the tracks so far, in seconds.
  double endOfFragments() const;
};

/// Reads the content of a "moov" box; nothing when it is damaged, or has no track or very many.
LUMORA_INTERNAL std::optional<MovieIndex> movieIndex(std::string_view content);

/// Reads the content of a "moof" box, and takes the ends of its tracks into the index.
/// \return how many bytes of samples belong to it; nothing, with the index as it was, when it is damaged
LUMORA_INTERNAL std::optional<std::uint64_t> addMovieFragment(std::string_view content, MovieIndex& index);

} // namespace lumora
