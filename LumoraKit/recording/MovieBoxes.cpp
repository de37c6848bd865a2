#include <LumoraKit/recording/MovieBoxes.h>

#include <algorithm>
#include <limits>

namespace lumora {
namespace {

constexpr std::size_t shortHeader = 8;
constexpr std::size_t typePlace = 4;
constexpr std::size_t typeLength = 4;
// More than a movie of ours has; the tracks are gone over for each fragment.
constexpr std::size_t mostTracks = 100;

// Reads numbers, most significant byte first. Beyond the end it gives zeros and is no longer sound.
class Numbers {
public:
  explicit Numbers(std::string_view bytes) : bytes_(bytes) {}

  bool isSound() const { return isSound_; }
  std::size_t left() const { return bytes_.size(); }
  void skip(std::size_t count) { take(count); }
  std::uint8_t byte() { return static_cast<std::uint8_t>(number(1)); }
  std::uint32_t word() { return static_cast<std::uint32_t>(number(4)); }
  std::uint64_t longWord() { return number(8); }

private:
  std::string_view take(std::size_t count) {
    if (count > bytes_.size()) {
      isSound_ = false;
      bytes_ = {};
      return {};
    }
    const auto taken = bytes_.substr(0, count);
    bytes_.remove_prefix(count);
    return taken;
  }
  std::uint64_t number(std::size_t count) {
    std::uint64_t number = 0;
    for (const char byte : take(count)) {
      number = number << 8U | static_cast<std::uint8_t>(byte);
    }
    return number;
  }

  std::string_view bytes_;
  bool isSound_ = true;
};

// The sizes and durations of a hostile file may add up to more than there are numbers.
std::uint64_t sum(std::uint64_t left, std::uint64_t right) {
  constexpr auto most = std::numeric_limits<std::uint64_t>::max();
  return left > most - right ? most : left + right;
}

double seconds(std::uint64_t units, std::uint32_t timescale) {
  return timescale == 0 ? 0 : static_cast<double>(units) / timescale;
}

// Shows the visitor each box in the content of another; false when one is damaged or the visitor says so.
using Visitor = std::function<bool(std::string_view type, std::string_view content)>;
bool visitBoxes(std::string_view content, const Visitor& visit) {
  while (!content.empty()) {
    const auto header = movieBoxHeader(content);
    const auto size = header && header->size == 0 ? content.size() : header ? header->size : 0;
    if (!header || size > content.size()) {
      return false;
    }
    const auto box = content.substr(0, static_cast<std::size_t>(size));
    if (!visit(header->type, box.substr(static_cast<std::size_t>(header->headerSize)))) {
      return false;
    }
    content.remove_prefix(box.size());
  }
  return true;
}

// A number of the fields "version, flags".
struct VersionAndFlags {
  explicit VersionAndFlags(Numbers& numbers) : version(numbers.byte()) {
    for (int i = 0; i < 3; ++i) {
      flags = flags << 8U | numbers.byte();
    }
  }
  bool has(std::uint32_t flag) const { return (flags & flag) != 0; }

  std::uint8_t version = 0;
  std::uint32_t flags = 0;
};

// The common beginning of "mvhd" and "mdhd": creation and modification time, units in a second, duration.
struct TimeHeader {
  explicit TimeHeader(std::string_view content) {
    Numbers numbers(content);
    const bool isLong = VersionAndFlags(numbers).version == 1;
    numbers.skip(isLong ? 16 : 8);
    timescale = numbers.word();
    duration = isLong ? numbers.longWord() : numbers.word();
    isSound = numbers.isSound();
  }

  std::uint32_t timescale = 0;
  std::uint64_t duration = 0;
  bool isSound = false;
};

bool readTrackID(std::string_view trackHeader, std::uint32_t& id) {
  Numbers numbers(trackHeader);
  numbers.skip(VersionAndFlags(numbers).version == 1 ? 16 : 8);
  id = numbers.word();
  return numbers.isSound();
}

bool readTrack(std::string_view content, MovieIndex& index) {
  std::uint32_t id = 0;
  std::uint32_t timescale = 0;
  const Visitor media = [&](std::string_view type, std::string_view box) {
    const bool isHeader = type == "mdhd";
    timescale = isHeader ? TimeHeader(box).timescale : timescale;
    return !isHeader || TimeHeader(box).isSound;
  };
  const bool isSound = visitBoxes(content, [&](std::string_view type, std::string_view box) {
    return type == "tkhd" ? readTrackID(box, id) : type != "mdia" || visitBoxes(box, media);
  });
  index.tracks[id].timescale = timescale;
  return isSound && id != 0 && timescale != 0;
}

bool readDefaults(std::string_view content, MovieIndex& index) {
  Numbers numbers(content);
  numbers.skip(4);
  const auto id = numbers.word();
  numbers.skip(4);
  MovieTrack& track = index.tracks[id];
  track.defaultDuration = numbers.word();
  track.defaultSize = numbers.word();
  return numbers.isSound();
}

bool readExtension(std::string_view content, MovieIndex& index) {
  index.isFragmented = true;
  return visitBoxes(
      content, [&](std::string_view type, std::string_view box) { return type != "trex" || readDefaults(box, index); });
}

bool readMovieHeader(std::string_view content, MovieIndex& index) {
  const TimeHeader header(content);
  index.duration = seconds(header.duration, header.timescale);
  return header.isSound;
}

// One "traf" box: some samples of one track.
class TrackFragment {
public:
  explicit TrackFragment(const MovieIndex& index) : index_(index) {}

  bool read(std::string_view content) {
    const bool isSound = visitBoxes(content, [this](std::string_view type, std::string_view box) {
      return type == "tfhd" ? readHeader(box) : type == "tfdt" ? readTime(box) : type != "trun" || readRun(box);
    });
    return isSound && hasHeader_;
  }
  std::uint32_t id() const { return id_; }
  const MovieTrack& track() const { return track_; }
  std::uint64_t dataSize() const { return dataSize_; }

private:
  bool readHeader(std::string_view content) {
    Numbers numbers(content);
    const VersionAndFlags facts(numbers);
    id_ = numbers.word();
    const auto found = index_.tracks.find(id_);
    if (found == index_.tracks.end()) {
      return false;
    }
    track_ = found->second;
    numbers.skip(facts.has(0x1) ? 8 : 0);
    numbers.skip(facts.has(0x2) ? 4 : 0);
    track_.defaultDuration = facts.has(0x8) ? numbers.word() : track_.defaultDuration;
    track_.defaultSize = facts.has(0x10) ? numbers.word() : track_.defaultSize;
    hasHeader_ = true;
    return numbers.isSound();
  }

  bool readTime(std::string_view content) {
    Numbers numbers(content);
    const bool isLong = VersionAndFlags(numbers).version == 1;
    track_.end = isLong ? numbers.longWord() : numbers.word();
    return numbers.isSound();
  }

  bool readRun(std::string_view content) {
    Numbers numbers(content);
    const VersionAndFlags facts(numbers);
    const std::uint64_t count = numbers.word();
    numbers.skip(facts.has(0x1) ? 4 : 0);
    numbers.skip(facts.has(0x4) ? 4 : 0);
    const bool hasDurations = facts.has(0x100);
    const bool hasSizes = facts.has(0x200);
    const std::size_t others = (facts.has(0x400) ? 4U : 0U) + (facts.has(0x800) ? 4U : 0U);
    const std::uint64_t sampleLength = (hasDurations ? 4U : 0U) + (hasSizes ? 4U : 0U) + others;
    if (!numbers.isSound() || count * sampleLength > numbers.left()) {
      return false;
    }
    // What is the same for all samples is not looked at sample by sample: nothing bounds their number.
    addSamples(hasDurations ? 0 : count, hasSizes ? 0 : count);
    for (std::uint64_t i = 0; i < count && (hasDurations || hasSizes); ++i) {
      track_.end = sum(track_.end, hasDurations ? numbers.word() : 0);
      dataSize_ = sum(dataSize_, hasSizes ? numbers.word() : 0);
      numbers.skip(others);
    }
    return numbers.isSound();
  }

  void addSamples(std::uint64_t withDefaultDuration, std::uint64_t withDefaultSize) {
    track_.end = sum(track_.end, withDefaultDuration * track_.defaultDuration);
    dataSize_ = sum(dataSize_, withDefaultSize * track_.defaultSize);
  }

  const MovieIndex& index_;
  std::uint32_t id_ = 0;
  MovieTrack track_;
  std::uint64_t dataSize_ = 0;
  bool hasHeader_ = false;
};

} // namespace

std::optional<MovieBoxHeader> movieBoxHeader(std::string_view bytes) {
  Numbers numbers(bytes);
  MovieBoxHeader header;
  header.size = numbers.word();
  header.type = bytes.substr(std::min(typePlace, bytes.size()), typeLength);
  numbers.skip(typeLength);
  header.headerSize = shortHeader;
  if (header.size == 1) {
    header.size = numbers.longWord();
    header.headerSize = longestBoxHeader;
    // Here 0 is no more than a wrong size.
    header.size = header.size == 0 ? 1 : header.size;
  }
  // QuickTime's own types may begin with the copyright sign of its old alphabet.
  const bool isPrintable = std::ranges::all_of(header.type, [](char letter) {
    return (letter >= ' ' && letter <= '~') || static_cast<std::uint8_t>(letter) == 0xA9;
  });
  const bool isLongEnough = header.size == 0 || header.size >= header.headerSize;
  return numbers.isSound() && isPrintable && isLongEnough ? std::optional(header) : std::nullopt;
}

double MovieTrack::endInSeconds() const {
  return seconds(end, timescale);
}

double MovieIndex::endOfFragments() const {
  double end = 0;
  for (const auto& [id, track] : tracks) {
    end = std::max(end, track.endInSeconds());
  }
  return end;
}

std::optional<MovieIndex> movieIndex(std::string_view content) {
  MovieIndex index;
  const bool isSound = visitBoxes(content, [&index](std::string_view type, std::string_view box) {
    return type == "mvhd"   ? readMovieHeader(box, index)
           : type == "trak" ? readTrack(box, index)
                            : type != "mvex" || readExtension(box, index);
  });
  const bool hasTracks = !index.tracks.empty() && index.tracks.size() <= mostTracks;
  return isSound && hasTracks ? std::optional(std::move(index)) : std::nullopt;
}

std::optional<std::uint64_t> addMovieFragment(std::string_view content, MovieIndex& index) {
  MovieIndex changed = index;
  std::uint64_t dataSize = 0;
  bool hasTrack = false;
  const bool isSound = visitBoxes(content, [&](std::string_view type, std::string_view box) {
    if (type != "traf") {
      return true;
    }
    TrackFragment fragment(changed);
    const bool isRead = fragment.read(box);
    if (isRead) {
      MovieTrack& track = changed.tracks[fragment.id()];
      track.end = std::max(track.end, fragment.track().end);
      dataSize = sum(dataSize, fragment.dataSize());
      hasTrack = true;
    }
    return isRead;
  });
  if (!isSound || !hasTrack) {
    return std::nullopt;
  }
  index = std::move(changed);
  return dataSize;
}

} // namespace lumora
