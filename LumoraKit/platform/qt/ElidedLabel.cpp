#include <LumoraKit/platform/qt/ElidedLabel.h>

#include <QFontMetricsF>
#include <QPainter>
#include <QPalette>
#include <QTextLayout>
#include <QTextOption>

namespace lumora::qt {

ElidedLabel::ElidedLabel(QWidget* parent) : QLabel(parent) {
  setTextFormat(Qt::PlainText);
}

ElidedLabel::~ElidedLabel() = default;

void ElidedLabel::setFullText(const QString& text) {
  setText(text);
  update();
}

// As many lines as have room, the last one elided when there are more.
QStringList ElidedLabel::lines() const {
  const QFontMetricsF metrics(font());
  const qsizetype room = qMax(1, static_cast<int>((height() + 1) / metrics.lineSpacing()));
  QTextLayout layout(text(), font());
  QTextOption option;
  option.setWrapMode(QTextOption::WrapAtWordBoundaryOrAnywhere);
  layout.setTextOption(option);
  QStringList lines;
  layout.beginLayout();
  for (QTextLine line = layout.createLine(); line.isValid(); line = layout.createLine()) {
    line.setLineWidth(width());
    if (lines.size() == room) {
      const int start = layout.lineAt(static_cast<int>(room) - 1).textStart();
      lines.back() = metrics.elidedText(text().mid(start), Qt::ElideRight, width());
      break;
    }
    lines.append(text().mid(line.textStart(), line.textLength()).trimmed());
  }
  layout.endLayout();
  return lines;
}

void ElidedLabel::paintEvent(QPaintEvent* /*event*/) {
  const QStringList shown = lines();
  // A tool tip is also what assistive software adds to the text, so there is none without need.
  const bool isCut = !shown.isEmpty() && shown.back().endsWith(u'…') && !text().endsWith(shown.back());
  if (const QString hidden = isCut ? text() : QString(); toolTip() != hidden) {
    setToolTip(hidden);
  }
  QPainter painter(this);
  painter.setPen(palette().color(foregroundRole()));
  const double lineHeight = QFontMetricsF(font()).lineSpacing();
  double top = (height() - lineHeight * static_cast<double>(shown.size())) / 2;
  // The text keeps its own direction: a sentence ends at its end, on whichever side the label stands.
  painter.setLayoutDirection(text().isRightToLeft() ? Qt::RightToLeft : Qt::LeftToRight);
  const auto side = layoutDirection() == Qt::RightToLeft ? Qt::AlignRight : Qt::AlignLeft;
  const int flags = static_cast<int>(side | Qt::AlignVCenter | Qt::AlignAbsolute) | Qt::TextSingleLine;
  for (const QString& line : shown) {
    painter.drawText(QRectF(0, top, width(), lineHeight), flags, line);
    top += lineHeight;
  }
}

} // namespace lumora::qt
