#include "recorder/window/Words.h"

#include <cmath>

namespace recorder {
namespace {

constexpr int minute = 60;
constexpr int hour = 3600;
constexpr int manyHours = 100;

} // namespace

Qt::LayoutDirection textDirection() {
  // Of a text, not of the language: one without texts here is shown in English.
  return words("Record").isRightToLeft() ? Qt::RightToLeft : Qt::LeftToRight;
}

QString clockText(double seconds) {
  const int whole = static_cast<int>(std::floor(seconds));
  const QString rest = QString("%1:%2")
                           .arg(whole % hour / minute, whole >= hour ? 2 : 1, 10, QChar('0'))
                           .arg(whole % minute, 2, 10, QChar('0'));
  return whole >= hour ? QString("%1:%2").arg(whole / hour).arg(rest) : rest;
}

QString spanText(double seconds) {
  const double most = static_cast<double>(manyHours) * hour;
  if (seconds >= most) {
    return words("more than 100 hours");
  }
  const int whole = static_cast<int>(seconds);
  if (whole >= hour) {
    return words("%1 h %2 min").arg(whole / hour).arg(whole % hour / minute);
  }
  return whole >= minute ? words("%1 min").arg(whole / minute) : words("%1 s").arg(whole);
}

} // namespace recorder
