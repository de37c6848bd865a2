#include <LumoraKit/platform/linux/gstreamer/AudioCutter.h>

#include <algorithm>
#include <cmath>

namespace lumora::backend {
namespace {

constexpr std::uint64_t second = 1'000'000'000;

// Time stamps of sound jitter a little while the samples themselves are continuous: within this the count of frames is
// believed, beyond it something was lost or repeated. At a start and after a pause the time stamp alone says where the
// sound belongs.
constexpr std::int64_t jitterMilliseconds = 5;

// What the time stamps say on the average is the device's own speed, and is followed.
constexpr double slipMilliseconds = 1;
constexpr double buffersToAverage = 32;

} // namespace

AudioCutter::AudioCutter(std::uint32_t rate, std::uint32_t encoderDelay) : rate_(rate), encoderDelay_(encoderDelay) {}

std::uint64_t AudioCutter::framesIn(std::uint64_t nanoseconds) const {
  // In two steps: the product of a long time and the rate does not fit.
  return nanoseconds / second * rate_ + (nanoseconds % second * rate_ + second / 2) / second;
}

std::uint64_t AudioCutter::fileTime(std::uint64_t position) const {
  return position / rate_ * second + (position % rate_ * second + rate_ / 2) / rate_;
}

std::int64_t AudioCutter::toleranceIn(const Timeline::Span& span) const {
  return section_ == span.resumes ? rate_ * jitterMilliseconds / 1000 : 0;
}

AudioCutter::Join AudioCutter::join(const Timeline::Span& span) {
  // Both as the decoder will count them: the encoder's delay comes before the first frame.
  const auto behind = static_cast<std::int64_t>(framesIn(span.fileTime) - (written_ + encoderDelay_));
  if (std::abs(behind) <= toleranceIn(span)) {
    return slip(behind);
  }
  behind_ = 0;
  return behind > 0 ? Join{static_cast<std::uint64_t>(behind), 0, 0} : Join{0, 0, static_cast<std::uint64_t>(-behind)};
}

AudioCutter::Join AudioCutter::slip(std::int64_t behind) {
  behind_ += (static_cast<double>(behind) - behind_) / buffersToAverage;
  if (std::abs(behind_) < rate_ * slipMilliseconds / 1000) {
    return {0, 0, 0};
  }
  const bool isSlow = behind_ > 0;
  behind_ += isSlow ? -1 : 1;
  return isSlow ? Join{0, 1, 0} : Join{0, 0, 1};
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
  const Join joined = join(span);
  const std::uint64_t first = framesIn(span.begin - begin) + joined.skipped;
  const std::uint64_t end = std::min(framesIn(span.end - begin), frames);
  if (first >= end) {
    // All of it is in the file already: what follows is placed by its time stamp, as at a seam.
    section_.reset();
    return std::nullopt;
  }
  const Piece piece{joined.silence, joined.repeats, first, end - first, written_};
  written_ += piece.silence + piece.repeats + piece.count;
  section_ = span.resumes;
  return piece;
}

} // namespace lumora::backend
