#pragma once

#include <vector>

namespace lumora::testing {

/// The headless microphone's tone (440 Hz) at one moment of a file.
struct Tone {
  static Tone at(const std::vector<double>& sound, double second);
  /// How much further apart than `elapsed` seconds the two sounds were made: at most half a period, 1.1 ms.
  static double shift(const Tone& first, const Tone& second, double elapsed);

  double amplitude;
  /// In periods, at that moment.
  double phase;
};

} // namespace lumora::testing
