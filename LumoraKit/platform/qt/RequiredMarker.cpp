#include <LumoraKit/platform/qt/RequiredMarker.h>

#include <QColor>
#include <QPainter>
#include <QPalette>

namespace lumora::qt {

RequiredMarker::RequiredMarker(QWidget* parent) : QLabel(parent) {
  // With a picture, assistive software takes the label for a graphic.
  QPixmap pixmap(1, 1);
  pixmap.fill(Qt::transparent);
  setPixmap(pixmap);
}

RequiredMarker::~RequiredMarker() = default;

void RequiredMarker::paintEvent(QPaintEvent* /*event*/) {
  const bool isDark = palette().color(QPalette::Window).lightness() < 128;
  QPainter painter(this);
  painter.setRenderHint(QPainter::Antialiasing);
  const double size = qMin(width(), height());
  painter.translate((width() - size) / 2, (height() - size) / 2);
  painter.scale(size / 16, size / 16);
  painter.setPen(Qt::NoPen);
  painter.setBrush(isDark ? QColor(0xff, 0x6b, 0x5e) : QColor(0xd7, 0x00, 0x15));
  painter.drawEllipse(QRectF(1.5, 1.5, 13, 13));
  painter.setBrush(isDark ? QColor(0x1e, 0x1e, 0x1e) : QColor(Qt::white));
  painter.drawRoundedRect(QRectF(7.1, 4.2, 1.8, 5.0), 0.9, 0.9);
  painter.drawEllipse(QRectF(7.0, 10.2, 2.0, 2.0));
}

} // namespace lumora::qt
