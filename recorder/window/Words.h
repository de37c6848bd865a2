#pragma once

#include "recorder/model/Texts.h"

#include <QString>

namespace recorder {

/// The text for the user of an English one.
inline QString words(Text english) {
  return QString::fromStdString(text(english));
}

/// In which the texts of the user's language run: from right to left in Arabic.
Qt::LayoutDirection textDirection();

/// "0:07", "1:02:03".
QString clockText(double seconds);

/// For a forecast, rounded down: "3 h 20 min", "12 min", "40 s".
QString spanText(double seconds);

} // namespace recorder
