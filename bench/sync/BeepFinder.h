#pragma once

#include <cmath>
#include <cstddef>

namespace lumora::bench {

/// Finds beeps in sound of 48,000 samples a second. The beep is ten times as high as the tone that is always there, of
/// which the second difference leaves little; a click is over too soon.
class BeepFinder {
public:
  /// How many samples after its begin a beep is recognised.
  static constexpr std::size_t lag = 240;

  /// True when a beep began `lag` samples before this one.
  bool feed(double sample) {
    const double height = std::abs(sample - 2 * last_ + before_);
    before_ = last_;
    last_ = sample;
    if (since_ == 0 && height <= loud) {
      return false;
    }
    high_ += height > audible ? 1 : 0;
    if (since_++ < lag) {
      return false;
    }
    const bool isBeep = high_ >= lag * 7 / 10;
    since_ = 0;
    high_ = 0;
    return isBeep;
  }

private:
  static constexpr double loud = 0.03;
  static constexpr double audible = 0.01;

  double before_ = 0;
  double last_ = 0;
  // Samples since a loud one, that one included, and how many of them were high.
  std::size_t since_ = 0;
  std::size_t high_ = 0;
};

} // namespace lumora::bench
