#include "recorder/window/Icons.h"

#include <QPainter>
#include <QPixmap>
#include <QPolygonF>

namespace recorder {
namespace {

// In a unit square.
void draw(QPainter& painter, Shape shape, const QColor& colour) {
  painter.setPen(Qt::NoPen);
  painter.setBrush(colour);
  switch (shape) {
  case Shape::Dot:
    painter.drawEllipse(QRectF(0.1, 0.1, 0.8, 0.8));
    break;
  case Shape::Square:
    painter.drawRoundedRect(QRectF(0.16, 0.16, 0.68, 0.68), 0.08, 0.08);
    break;
  case Shape::Bars:
    painter.drawRect(QRectF(0.2, 0.15, 0.2, 0.7));
    painter.drawRect(QRectF(0.6, 0.15, 0.2, 0.7));
    break;
  case Shape::Triangle:
    painter.drawPolygon(QPolygonF({QPointF(0.22, 0.12), QPointF(0.88, 0.5), QPointF(0.22, 0.88)}));
    break;
  case Shape::Cross:
    painter.setPen(QPen(colour, 0.14, Qt::SolidLine, Qt::RoundCap));
    painter.drawLine(QPointF(0.22, 0.22), QPointF(0.78, 0.78));
    painter.drawLine(QPointF(0.78, 0.22), QPointF(0.22, 0.78));
    break;
  }
}

} // namespace

QIcon signIcon(Shape shape, const QColor& colour) {
  QIcon icon;
  for (const int size : {16, 24, 32, 48, 64}) {
    QPixmap pixmap(size, size);
    pixmap.fill(Qt::transparent);
    QPainter painter(&pixmap);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.scale(size, size);
    draw(painter, shape, colour);
    icon.addPixmap(pixmap);
  }
  return icon;
}

} // namespace recorder
