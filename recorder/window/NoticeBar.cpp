#include "recorder/window/NoticeBar.h"

#include "recorder/window/Colours.h"
#include "recorder/window/Icons.h"
#include "recorder/window/Words.h"

#include <QEvent>
#include <QHBoxLayout>

namespace recorder {
namespace {

constexpr double strength = 0.22;

} // namespace

NoticeBar::NoticeBar(QWidget* parent) : QFrame(parent), text_(new QLabel(this)), close_(new QToolButton(this)) {
  setObjectName("notice");
  setAutoFillBackground(true);
  text_->setWordWrap(true);
  text_->setTextFormat(Qt::PlainText);
  close_->setAutoRaise(true);
  close_->setFocusPolicy(Qt::StrongFocus);
  close_->setAccessibleName(words("Put the message away"));
  close_->setToolTip(words("Put the message away"));
  auto* const layout = new QHBoxLayout(this);
  layout->addWidget(text_, 1);
  layout->addWidget(close_, 0, Qt::AlignTop);
  connect(close_, &QToolButton::clicked, this, &NoticeBar::dismissed);
  paintBackground();
  hide();
}

void NoticeBar::setText(const QString& text) {
  text_->setText(text);
  setAccessibleName(text);
  setVisible(!text.isEmpty());
}

void NoticeBar::changeEvent(QEvent* event) {
  if (event->type() == QEvent::ParentChange || event->type() == QEvent::ApplicationPaletteChange) {
    paintBackground();
  }
  QFrame::changeEvent(event);
}

void NoticeBar::paintBackground() {
  const QPalette whole = parentWidget()->palette();
  QPalette own = whole;
  own.setColor(QPalette::Window, tint(Signal::Warning, whole, strength));
  setPalette(own);
  close_->setIcon(signIcon(recorder::Shape::Cross, whole.color(QPalette::WindowText)));
}

} // namespace recorder
