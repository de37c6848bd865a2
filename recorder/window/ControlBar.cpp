#include "recorder/window/ControlBar.h"

#include "recorder/window/Colours.h"
#include "recorder/window/IconButton.h"
#include "recorder/window/Icons.h"
#include "recorder/window/Words.h"

#include <QEvent>
#include <QHBoxLayout>
#include <QVBoxLayout>

namespace recorder {
namespace {

constexpr double large = 1.25;
constexpr double huge = 2.2;

QFont enlarged(QFont font, double factor) {
  if (font.pointSizeF() > 0) {
    font.setPointSizeF(font.pointSizeF() * factor);
  } else {
    font.setPixelSize(static_cast<int>(font.pixelSize() * factor));
  }
  return font;
}

Text describe(TakeState state) {
  switch (state) {
  case TakeState::Starting:
    return "Starting…";
  case TakeState::Recording:
    return "Recording";
  case TakeState::Pausing:
  case TakeState::Paused:
    return "Paused";
  case TakeState::Resuming:
    return "Resuming…";
  case TakeState::Stopping:
    return "Finishing the recording…";
  case TakeState::Cancelling:
    return "Discarding the recording…";
  default:
    return "Ready to record";
  }
}

} // namespace

ControlBar::ControlBar(std::shared_ptr<Studio> studio, QWidget* parent)
    : QWidget(parent), studio_(std::move(studio)), record_(makeButton("record", "Record")),
      stop_(makeButton("stop", "Stop")), pause_(makeButton("pause", "Pause")), cancel_(makeButton("cancel", "Discard")),
      elapsed_(new QLabel(this)), state_(new QLabel(this)), room_(new QLabel(this)) {
  build();
  drawSigns();
  connect(record_, &QPushButton::clicked, this, [this] { studio_->record(); });
  connect(stop_, &QPushButton::clicked, this, &ControlBar::stopWanted);
  connect(pause_, &QPushButton::clicked, this, &ControlBar::togglePause);
  connect(cancel_, &QPushButton::clicked, this, &ControlBar::cancelWanted);
  refresh();
}

QPushButton* ControlBar::makeButton(const char* name, Text label) {
  auto* const button = new IconButton(words(label), this);
  button->setObjectName(name);
  button->setAutoDefault(true);
  return button;
}

void ControlBar::build() {
  for (QPushButton* const main : {record_, stop_}) {
    QFont font = enlarged(main->font(), large);
    font.setBold(true);
    main->setFont(font);
    const int unit = QFontMetrics(font).height();
    main->setIconSize(QSize(unit, unit));
    main->setMinimumSize(unit * 8, unit * 5 / 2);
  }
  for (QPushButton* const other : {pause_, cancel_}) {
    other->setMinimumHeight(record_->minimumHeight());
    other->setMinimumWidth(fontMetrics().height() * 7);
  }
  elapsed_->setFont(enlarged(font(), huge));
  elapsed_->setAccessibleName(words("Elapsed time"));
  state_->setWordWrap(true);
  room_->setWordWrap(true);
  room_->setAlignment(Qt::AlignRight | Qt::AlignVCenter);
  room_->setAccessibleName(words("Room for recordings"));
  auto* const times = new QVBoxLayout;
  times->setSpacing(0);
  times->addWidget(elapsed_);
  times->addWidget(state_);
  auto* const layout = new QHBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->addLayout(times, 1);
  layout->addWidget(record_);
  layout->addWidget(stop_);
  layout->addWidget(pause_);
  layout->addWidget(cancel_);
  layout->addWidget(room_, 1);
}

void ControlBar::drawSigns() {
  const QColor ink = palette().color(QPalette::ButtonText);
  const bool isPaused = studio_->take() && studio_->take()->state() == TakeState::Paused;
  record_->setIcon(signIcon(Shape::Dot, colourOf(Signal::Danger, palette())));
  stop_->setIcon(signIcon(Shape::Square, colourOf(Signal::Danger, palette())));
  pause_->setIcon(signIcon(isPaused ? Shape::Triangle : Shape::Bars, ink));
  cancel_->setIcon(signIcon(Shape::Cross, ink));
}

void ControlBar::changeEvent(QEvent* event) {
  if (event->type() == QEvent::PaletteChange) {
    drawSigns();
  }
  QWidget::changeEvent(event);
}

void ControlBar::togglePause() {
  if (const auto& take = studio_->take()) {
    take->state() == TakeState::Paused ? take->resume() : take->pause();
  }
}

void ControlBar::refresh() {
  const auto& take = studio_->take();
  const TakeState state = take ? take->state() : TakeState::Ready;
  const bool isUnderWay = studio_->isUnderWay();
  const bool isSettled = state == TakeState::Recording || state == TakeState::Paused;
  const bool hadFocus = record_->hasFocus() || stop_->hasFocus();
  record_->setVisible(!isUnderWay);
  record_->setEnabled(studio_->canRecord());
  for (QPushButton* const button : {stop_, pause_, cancel_}) {
    button->setVisible(isUnderWay);
  }
  stop_->setEnabled(isSettled);
  pause_->setEnabled(isSettled && !take->nothingRecords());
  pause_->setText(state == TakeState::Paused ? words("Resume") : words("Pause"));
  cancel_->setEnabled(isSettled || state == TakeState::Starting);
  if (hadFocus) {
    (isUnderWay ? stop_ : record_)->setFocus();
  }
  state_->setText(take ? words(describe(state)) : words("Not ready to record yet"));
  drawSigns();
  showNow();
}

void ControlBar::showNow() {
  const auto& take = studio_->take();
  const QString elapsed = clockText(take ? take->elapsedTime() : 0);
  if (elapsed != elapsed_->text()) {
    elapsed_->setText(elapsed);
  }
  const auto room = studio_->roomLeft();
  const QString left = room ? words("Room for %1").arg(spanText(*room)) : QString();
  if (left != room_->text()) {
    room_->setText(left);
  }
}

} // namespace recorder
