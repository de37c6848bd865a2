#pragma once

#include <QColor>
#include <QPalette>

namespace recorder {

/// Signal colours that are legible on the palette's window, light or dark.
enum class Signal { Good, Warning, Danger, Busy, Quiet };

QColor colourOf(Signal signal, const QPalette& palette);

/// `part` of the signal's colour in the window's: for the background of a message.
QColor tint(Signal signal, const QPalette& palette, double part);

} // namespace recorder
