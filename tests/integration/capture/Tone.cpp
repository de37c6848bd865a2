#include "Tone.h"

#include <cmath>
#include <complex>
#include <numbers>

namespace lumora::testing {
namespace {

constexpr double frequency = 440;
constexpr double rate = 48'000;

} // namespace

Tone Tone::at(const std::vector<double>& sound, double second) {
  const auto begin = static_cast<std::size_t>(second * rate);
  // 44 whole periods.
  constexpr std::size_t length = 4800;
  std::complex<double> sum;
  for (std::size_t i = begin; i < begin + length && i < sound.size(); ++i) {
    const double time = static_cast<double>(i) / rate - second;
    sum += sound[i] * std::polar(1.0, -2 * std::numbers::pi * frequency * time);
  }
  return {2 * std::abs(sum) / length, std::arg(sum) / (2 * std::numbers::pi)};
}

double Tone::shift(const Tone& first, const Tone& second, double elapsed) {
  const double periods = second.phase - first.phase - frequency * elapsed;
  return (periods - std::round(periods)) / frequency;
}

} // namespace lumora::testing
