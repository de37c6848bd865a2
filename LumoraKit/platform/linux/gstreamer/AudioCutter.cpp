#include <LumoraKit/platform/linux/gstreamer/AudioCutter.h>

#include <algorithm>

namespace lumora::backend {
namespace {

constexpr std::uint64_t second = 1'000'000'000;

// Time stamps of sound jitter by some milliseconds while the samples themselves are continuous: within this the
// count of frames is believed, beyond it something was lost or repeated. At a start and after a pause the time stamp
// alone says where the sound belongs.
constexpr std::uint64_t jitterMilliseconds = 20;

} // namespace

AudioCutter::AudioCutter(std::uint32_t rate, std::uint32_t encoderDelay) : rate_(rate), encoderDelay_(encoderDelay) {}

std::uint64_t AudioCutter::framesIn(std::uint64_t nanoseconds) const {
  // In two steps: the product of a long time and the rate does not fit.
  return nanoseconds / second * rate_ + (nanoseconds % second * rate_ + second / 2) / second;
}

std::uint64_t AudioCutter::fileTime(std::uint64_t position) const {
  return position / rate_ * second + (position % rate_ * second + rate_ / 2) / rate_;
}

std::uint64_t AudioCutter::toleranceIn(const Timeline::Span& span) const {
  return section_ == span.resumes ? rate_ * jitterMilliseconds / 1000 : 0;
}

std::vector<AudioCutter::Piece> AudioCutter::cut(const Timeline& timeline, HostTime begin, std::uint64_t frames) {
  std::vector<Piece> pieces;
  for (const Timeline::Span& span : timeline.spans(begin, begin + duration(frames))) {
    if (const auto piece = place(span, begin, frames)) {
      pieces.push_back(*piece);
    }
  }
  return pieces;
}

std::optional<AudioCutter::Piece> AudioCutter::place(const Timeline::Span& span, HostTime begin, std::uint64_t frames) {
  std::uint64_t first = framesIn(span.begin - begin);
  const std::uint64_t end = std::min(framesIn(span.end - begin), frames);
  // Both as the decoder will count them: the encoder's delay comes before the first frame.
  const std::uint64_t wanted = framesIn(span.fileTime);
  const std::uint64_t expected = written_ + encoderDelay_;
  const std::uint64_t tolerance = toleranceIn(span);
  std::uint64_t silence = 0;
  if (wanted > expected + tolerance) {
    silence = wanted - expected;
  } else if (wanted + tolerance < expected) {
    first += expected - wanted;
  }
  if (first >= end) {
    // All of it is in the file already: what follows is placed by its time stamp, as at a seam.
    section_.reset();
    return std::nullopt;
  }
  const Piece piece{silence, first, end - first, written_};
  written_ += silence + piece.count;
  section_ = span.resumes;
  return piece;
}

} // namespace lumora::backend
