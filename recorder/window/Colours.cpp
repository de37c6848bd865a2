#include "recorder/window/Colours.h"

namespace recorder {
namespace {

bool isDark(const QPalette& palette) {
  return palette.color(QPalette::Window).lightness() < palette.color(QPalette::WindowText).lightness();
}

QColor mixed(const QColor& one, const QColor& other, double part) {
  const auto channel = [part](int from, int to) { return static_cast<int>(from + (to - from) * part); };
  return {channel(one.red(), other.red()), channel(one.green(), other.green()), channel(one.blue(), other.blue())};
}

} // namespace

QColor colourOf(Signal signal, const QPalette& palette) {
  const bool dark = isDark(palette);
  switch (signal) {
  case Signal::Good:
    return dark ? QColor(0x4c, 0xc3, 0x6b) : QColor(0x1f, 0x8f, 0x3f);
  case Signal::Warning:
    return dark ? QColor(0xf5, 0xb3, 0x3d) : QColor(0xc2, 0x7a, 0x00);
  case Signal::Danger:
    return dark ? QColor(0xff, 0x5c, 0x57) : QColor(0xd9, 0x2b, 0x2b);
  case Signal::Busy:
    return dark ? QColor(0x6a, 0xa9, 0xf7) : QColor(0x1f, 0x6f, 0xd0);
  case Signal::Quiet:
    break;
  }
  return mixed(palette.color(QPalette::Window), palette.color(QPalette::WindowText), 0.55);
}

QColor tint(Signal signal, const QPalette& palette, double part) {
  return mixed(palette.color(QPalette::Window), colourOf(signal, palette), part);
}

} // namespace recorder
