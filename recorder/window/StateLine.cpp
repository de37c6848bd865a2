#include "recorder/window/StateLine.h"

#include "recorder/window/Icons.h"

#include <QEvent>
#include <QHBoxLayout>

namespace recorder {

StateLine::StateLine(QWidget* parent) : QWidget(parent), dot_(new QLabel(this)), text_(new QLabel(this)) {
  auto* const layout = new QHBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->addWidget(dot_, 0, Qt::AlignTop);
  dot_->setFixedHeight(fontMetrics().height());
  layout->addWidget(text_, 1);
  text_->setWordWrap(true);
  text_->setTextFormat(Qt::PlainText);
  drawDot();
}

void StateLine::set(Signal signal, const QString& text) {
  if (signal != signal_) {
    signal_ = signal;
    drawDot();
  }
  if (text != text_->text()) {
    text_->setText(text);
    setAccessibleName(text);
  }
}

void StateLine::changeEvent(QEvent* event) {
  if (event->type() == QEvent::PaletteChange) {
    drawDot();
  }
  QWidget::changeEvent(event);
}

void StateLine::drawDot() {
  const int size = fontMetrics().ascent();
  dot_->setPixmap(signIcon(Shape::Dot, colourOf(signal_, palette())).pixmap(QSize(size, size), devicePixelRatio()));
}

} // namespace recorder
