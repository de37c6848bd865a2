#include <LumoraKit/platform/qt/BusyIndicator.h>

#include <QPainter>
#include <QPalette>
#include <QPen>

namespace lumora::qt {
namespace {

constexpr int spokes = 12;

// The spoke that leads is dark, those behind it fade.
double opacity(int age) {
  return qMax(0.14, 0.85 - age * 0.08);
}

} // namespace

BusyIndicator::BusyIndicator(QWidget* parent) : QProgressBar(parent) {
  setRange(0, 0);
  setTextVisible(false);
  turn_.setStartValue(0);
  turn_.setEndValue(spokes);
  turn_.setDuration(1000);
  turn_.setLoopCount(-1);
  connect(&turn_, &QVariantAnimation::valueChanged, this, [this] { update(); });
}

BusyIndicator::~BusyIndicator() = default;

void BusyIndicator::showEvent(QShowEvent* event) {
  QProgressBar::showEvent(event);
  turn_.start();
}

void BusyIndicator::hideEvent(QHideEvent* event) {
  QProgressBar::hideEvent(event);
  turn_.stop();
}

void BusyIndicator::paintEvent(QPaintEvent* /*event*/) {
  QPainter painter(this);
  painter.setRenderHint(QPainter::Antialiasing);
  const double size = qMin(width(), height());
  painter.translate(width() / 2.0, height() / 2.0);
  painter.scale(size / 16, size / 16);
  QColor color = palette().color(QPalette::WindowText);
  const int leading = turn_.currentValue().toInt() % spokes;
  for (int spoke = 0; spoke < spokes; ++spoke) {
    color.setAlphaF(static_cast<float>(opacity((leading - spoke + spokes) % spokes)));
    painter.setPen(QPen(color, 1.5, Qt::SolidLine, Qt::RoundCap));
    painter.drawLine(QPointF(0, -4), QPointF(0, -7));
    painter.rotate(360.0 / spokes);
  }
}

} // namespace lumora::qt
