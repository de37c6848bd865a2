#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRMovieFile.h>
#include <LumoraKit/recording/MovieBoxes.h>

#include <algorithm>
#include <optional>
#include <utility>

using lumora::Platform;

namespace {

// More than recordings of days have; what has more is made to keep its reader busy.
constexpr int mostBoxes = 2'000'000;
// More than the index of a recording of days takes.
constexpr std::uint64_t longestIndex = 64'000'000;

// Goes over the boxes of a file, one after another, up to the first that is not whole.
class Scan {
public:
  Scan(const std::filesystem::path& file, std::uint64_t size) : file_(file), size_(size) {}

  void run() {
    int boxes = 0;
    while (place_ < size_ && boxes < mostBoxes && takeBox()) {
      ++boxes;
    }
    isTooLong_ = boxes == mostBoxes;
  }

  /// The end of the last whole box that is not waiting for another.
  std::uint64_t wholeUpTo() const { return whole_; }
  double duration() const { return index_ && index_->isFragmented ? index_->endOfFragments() : movieDuration(); }

  /// Why there is nothing to play; empty when there is.
  std::string complaint() const {
    if (error_) {
      return error_->localizedDescription();
    }
    if (isTooLong_) {
      return "It has more parts than any recording";
    }
    if (!index_) {
      return "It has no complete index of a movie";
    }
    if (index_->isFragmented && !hasFragment_) {
      return "It ended before its first part was complete";
    }
    if (!index_->isFragmented && (!hasData_ || whole_ != size_)) {
      return "It is not complete, and has no parts that could be kept";
    }
    if (size_ - whole_ > LMRMovieFile::mostLostBytes) {
      return "It is damaged long before its end";
    }
    return {};
  }

private:
  double movieDuration() const { return index_ ? index_->duration : 0; }

  std::optional<std::string> read(std::uint64_t place, std::uint64_t length) {
    auto bytes = Platform::current().files->partOfFile(file_, place, static_cast<std::size_t>(length), &error_);
    return bytes && bytes->size() == length ? std::move(bytes) : std::nullopt;
  }

  // False when it is not whole.
  bool takeBox() {
    const auto bytes = read(place_, std::min<std::uint64_t>(size_ - place_, lumora::longestBoxHeader));
    auto header = bytes ? lumora::movieBoxHeader(*bytes) : std::nullopt;
    if (!header) {
      return false;
    }
    // Zeros, which is what a disk may leave behind after a power failure, are no type.
    header->size = header->size == 0 ? size_ - place_ : header->size;
    if (header->size > size_ - place_ || !takeContent(*header)) {
      return false;
    }
    place_ += header->size;
    whole_ = awaited_ ? whole_ : place_;
    return true;
  }

  bool takeContent(const lumora::MovieBoxHeader& header) {
    const std::uint64_t length = header.size - header.headerSize;
    if (header.type == "ftyp") {
      hasType_ = true;
      return true;
    }
    if (header.type == "mdat") {
      return takeData(length);
    }
    if (header.type != "moov" && header.type != "moof") {
      return true;
    }
    const auto content = length <= longestIndex ? read(place_ + header.headerSize, length) : std::nullopt;
    return content && (header.type == "moov" ? takeIndex(*content) : takeFragment(*content));
  }

  bool takeIndex(const std::string& content) {
    // The type stands before it. A second index would say something else of the fragments so far.
    if (!hasType_ || index_) {
      return false;
    }
    index_ = lumora::movieIndex(content);
    return index_.has_value();
  }

  // It counts when its samples have come.
  bool takeFragment(const std::string& content) {
    if (!index_ || awaited_) {
      return false;
    }
    indexWithFragment_ = *index_;
    awaited_ = lumora::addMovieFragment(content, indexWithFragment_);
    return awaited_.has_value();
  }

  bool takeData(std::uint64_t length) {
    if (awaited_) {
      if (*awaited_ > length) {
        return false;
      }
      index_ = std::move(indexWithFragment_);
      awaited_.reset();
      hasFragment_ = true;
    }
    hasData_ = true;
    return true;
  }

  const std::filesystem::path& file_;
  const std::uint64_t size_;
  std::uint64_t place_ = 0;
  std::uint64_t whole_ = 0;
  bool isTooLong_ = false;
  bool hasType_ = false;
  bool hasData_ = false;
  bool hasFragment_ = false;
  std::optional<lumora::MovieIndex> index_;
  // While a fragment's samples are to come: how many bytes they are, and the index with it.
  std::optional<std::uint64_t> awaited_;
  lumora::MovieIndex indexWithFragment_;
  LMRErrorRef error_;
};

LMRErrorRef refusal(const std::filesystem::path& file, const std::string& why) {
  return LMRError::make(LMRMovieFileErrorDomain, 1, lumora::format("%@: %@", {file.string(), why}));
}

} // namespace

LMRMovieFile LMRMovieFile::movieFileWithPath(const std::filesystem::path& file) {
  LMRMovieFile movie;
  movie.file = file;
  auto& files = *Platform::current().files;
  if (!files.isFile(file)) {
    return movie;
  }
  movie.state = State::Unusable;
  LMRErrorRef error;
  const auto size = files.sizeOfFile(file, &error);
  if (!size) {
    movie.reason = error->localizedDescription();
    return movie;
  }
  movie.size = *size;
  Scan scan(file, *size);
  scan.run();
  movie.reason = scan.complaint();
  if (movie.reason.empty()) {
    movie.usableSize = scan.wholeUpTo();
    movie.duration = scan.duration();
    movie.state = movie.usableSize == movie.size ? State::Complete : State::Torn;
  }
  return movie;
}

double LMRMovieFile::lostSeconds() const {
  return usableSize == 0 ? 0 : static_cast<double>(lostBytes()) * duration / static_cast<double>(usableSize);
}

LMRErrorRef LMRMovieFile::repair() {
  if (state == State::Complete) {
    return nullptr;
  }
  if (state != State::Torn) {
    return refusal(file, state == State::Missing ? "There is no such file" : reason);
  }
  auto& files = *Platform::current().files;
  LMRErrorRef error;
  const auto sizeNow = files.sizeOfFile(file, &error);
  if (sizeNow && *sizeNow != size) {
    error = refusal(file, "It has changed meanwhile");
  }
  error = error ? error : files.truncateFile(file, usableSize);
  if (!error) {
    state = State::Complete;
    lumora::log("The movie %@ was cut from %@ to %@ bytes",
                {file.string(), lumora::text(size), lumora::text(usableSize)});
  }
  return error;
}
