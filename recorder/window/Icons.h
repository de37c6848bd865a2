#pragma once

#include <QColor>
#include <QIcon>

namespace recorder {

enum class Shape { Dot, Square, Bars, Triangle, Cross };

/// The signs of the buttons, drawn sharp at every density.
QIcon signIcon(Shape shape, const QColor& colour);

} // namespace recorder
