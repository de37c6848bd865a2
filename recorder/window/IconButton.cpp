#include "recorder/window/IconButton.h"

#include <QStyleOptionButton>
#include <QStylePainter>

namespace recorder {

void IconButton::paintEvent(QPaintEvent* /*event*/) {
  QStyleOptionButton option;
  initStyleOption(&option);
  QStylePainter painter(this);
  // Told no direction, the painter of an application from right to left turns over the alignment that the style chose.
  painter.setLayoutDirection(Qt::LeftToRight);
  painter.drawControl(QStyle::CE_PushButton, option);
}

} // namespace recorder
