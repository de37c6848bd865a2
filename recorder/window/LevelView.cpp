#include "recorder/window/LevelView.h"

#include "recorder/window/Colours.h"
#include "recorder/window/Words.h"

#include <QLinearGradient>
#include <QPainter>
#include <algorithm>

namespace recorder {
namespace {

constexpr double lowest = -60;
// A fifteenth of a second each.
constexpr double fall = 0.03;
constexpr int barHeight = 5;
constexpr int gap = 2;
constexpr double loudFrom = 0.8;
constexpr double tooLoudFrom = 0.95;

double heightOf(double level) {
  return std::clamp((LMRLevelMeter::decibels(level) - lowest) / -lowest, 0.0, 1.0);
}

} // namespace

LevelView::LevelView(QWidget* parent) : QWidget(parent), heights_(2) {
  setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
  setAccessibleName(words("Sound level"));
}

void LevelView::setLevels(const std::vector<lumora::SoundLevel>& levels) {
  heights_.resize(std::max<std::size_t>(levels.empty() ? heights_.size() : levels.size(), 1));
  for (std::size_t i = 0; i < heights_.size(); ++i) {
    const double now = i < levels.size() ? heightOf(levels[i].peak) : 0;
    heights_[i] = std::max(now, std::max(heights_[i] - fall, 0.0));
  }
  const double loudest = *std::ranges::max_element(heights_);
  setAccessibleDescription(QString("%1 %").arg(static_cast<int>(loudest * 100)));
  update();
}

void LevelView::clear() {
  std::ranges::fill(heights_, 0);
  update();
}

QSize LevelView::sizeHint() const {
  return {120, 2 * barHeight + gap};
}

void LevelView::paintEvent(QPaintEvent*) {
  QPainter painter(this);
  painter.setRenderHint(QPainter::Antialiasing);
  if (layoutDirection() == Qt::RightToLeft) {
    painter.translate(width(), 0);
    painter.scale(-1, 1);
  }
  painter.setPen(Qt::NoPen);
  QLinearGradient colours(0, 0, width(), 0);
  colours.setColorAt(0, colourOf(Signal::Good, palette()));
  colours.setColorAt(loudFrom - 0.1, colourOf(Signal::Good, palette()));
  colours.setColorAt(loudFrom, colourOf(Signal::Warning, palette()));
  colours.setColorAt(tooLoudFrom, colourOf(Signal::Danger, palette()));
  const int count = static_cast<int>(heights_.size());
  int y = (height() - count * barHeight - (count - 1) * gap) / 2;
  for (const double each : heights_) {
    const QRectF track(0, y, width(), barHeight);
    painter.setBrush(tint(Signal::Quiet, palette(), 0.3));
    painter.drawRoundedRect(track, barHeight / 2.0, barHeight / 2.0);
    painter.setBrush(colours);
    painter.drawRoundedRect(QRectF(0, y, width() * each, barHeight), barHeight / 2.0, barHeight / 2.0);
    y += barHeight + gap;
  }
}

} // namespace recorder
