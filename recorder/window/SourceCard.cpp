#include "recorder/window/SourceCard.h"

#include "recorder/window/Words.h"

#include <QHBoxLayout>
#include <QSignalBlocker>
#include <QVBoxLayout>

namespace recorder {
namespace {

struct Description {
  Signal signal;
  Text text;
};

Description descriptionOf(const Source& source) {
  switch (source.state()) {
  case SourceState::Opening:
    return {Signal::Busy, "Opening…"};
  case SourceState::AskingUser:
    return {Signal::Busy, "Please allow the screen to be recorded"};
  case SourceState::Starting:
    return {Signal::Busy, "Starting…"};
  case SourceState::Recording:
    return {Signal::Danger, "Recording"};
  case SourceState::Paused:
    return {Signal::Warning, "Paused"};
  default:
    return {Signal::Good, "Ready"};
  }
}

QString keyOf(const SourceDescription& source) {
  return QString("%1:%2").arg(static_cast<int>(source.kind)).arg(QString::fromStdString(source.identifier));
}

} // namespace

SourceCard::SourceCard(std::shared_ptr<Studio> studio, std::size_t place, QWidget* parent)
    : QWidget(parent), studio_(std::move(studio)), place_(place), sourceBox_(new QComboBox(this)),
      picture_(new PictureView(this)), state_(new StateLine(this)), again_(new QPushButton(words("Try Again"), this)),
      microphoneBox_(new QComboBox(this)), level_(new LevelView(this)) {
  build();
  connect(sourceBox_, &QComboBox::activated, this, [this](int index) {
    studio_->chooseSource(place_, studio_->selection().sourcesFor(place_)[static_cast<std::size_t>(index)]);
  });
  connect(microphoneBox_, &QComboBox::activated, this,
          [this](int) { studio_->chooseMicrophone(place_, microphoneBox_->currentData().toString().toStdString()); });
  connect(again_, &QPushButton::clicked, this, [this] { studio_->reopen(place_); });
  refresh();
}

void SourceCard::build() {
  setObjectName(QString("sourceCard%1").arg(place_));
  sourceBox_->setAccessibleName(words("Source %1").arg(place_ + 1));
  sourceBox_->setObjectName(QString("source%1").arg(place_));
  microphoneBox_->setAccessibleName(words("Microphone of source %1").arg(place_ + 1));
  microphoneBox_->setObjectName(QString("microphone%1").arg(place_));
  for (QComboBox* const box : {sourceBox_, microphoneBox_}) {
    box->setSizeAdjustPolicy(QComboBox::AdjustToMinimumContentsLengthWithIcon);
    box->setMinimumContentsLength(10);
  }
  again_->setAutoDefault(false);
  auto* const stateRow = new QHBoxLayout;
  stateRow->addWidget(state_, 1);
  stateRow->addWidget(again_);
  auto* const soundRow = new QHBoxLayout;
  soundRow->addWidget(microphoneBox_, 1);
  soundRow->addWidget(level_, 1);
  auto* const layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->addStretch(1);
  layout->addWidget(sourceBox_);
  layout->addWidget(picture_, 100);
  layout->addLayout(stateRow);
  layout->addLayout(soundRow);
  layout->addStretch(1);
}

// What is too high for a picture stays empty above and below the card.
void SourceCard::resizeEvent(QResizeEvent* event) {
  picture_->setMaximumHeight(PictureView::heightFor(width()));
  QWidget::resizeEvent(event);
}

std::shared_ptr<Source> SourceCard::source() const {
  return place_ < studio_->sources().size() ? studio_->sources()[place_] : nullptr;
}

void SourceCard::fill(QComboBox& box, const SourceDescriptions& choices, const QString& chosen) {
  const QSignalBlocker blocker(box);
  box.clear();
  for (const SourceDescription& choice : choices) {
    box.addItem(QString::fromStdString(choice.name), keyOf(choice));
  }
  box.setCurrentIndex(box.findData(chosen));
}

void SourceCard::refresh() {
  if (place_ < studio_->selection().plan().size()) {
    refreshChoices();
    refreshState();
  }
}

void SourceCard::refreshChoices() {
  const Selection& selection = studio_->selection();
  const PlannedSource& planned = selection.plan()[place_];
  fill(*sourceBox_, selection.sourcesFor(place_), keyOf(planned.source));
  const QSignalBlocker blocker(microphoneBox_);
  microphoneBox_->clear();
  microphoneBox_->addItem(words("No microphone"), QString());
  for (const SourceDescription& microphone : selection.microphonesFor(place_)) {
    microphoneBox_->addItem(QString::fromStdString(microphone.name), QString::fromStdString(microphone.identifier));
  }
  microphoneBox_->setCurrentIndex(microphoneBox_->findData(QString::fromStdString(planned.microphone)));
  microphoneBox_->setVisible(planned.source.hasPicture() && !planned.source.isRemote());
  const bool isFree = !studio_->isUnderWay();
  sourceBox_->setEnabled(isFree);
  microphoneBox_->setEnabled(isFree);
}

void SourceCard::refreshState() {
  const auto source = this->source();
  if (!source) {
    return;
  }
  level_->setVisible(source->hasSound());
  again_->setVisible(source->error() && !studio_->isUnderWay());
  if (source->error()) {
    state_->set(Signal::Danger, QString::fromStdString(source->error()->localizedDescription()));
    picture_->setText(words("No picture"));
    level_->clear();
    return;
  }
  const auto [signal, text] = descriptionOf(*source);
  if (source->isSilent()) {
    state_->set(Signal::Warning, words("The microphone has been silent for 10 seconds"));
  } else {
    state_->set(signal, words(text));
  }
  if (source->plan().source.kind == SourceKind::Microphone) {
    picture_->setText(words("Sound only"));
  } else if (!source->picture() && source->pictureFile().empty()) {
    picture_->setText(words("The picture comes in a moment"));
  }
}

void SourceCard::showNow() {
  const auto source = this->source();
  if (!source || source->error()) {
    return;
  }
  if (source->picture()) {
    picture_->setPicture(*source->picture());
  } else if (!source->pictureFile().empty()) {
    picture_->setPictureFile(source->pictureFile());
  }
  if (source->hasSound()) {
    level_->setLevels(source->levels());
  }
  refreshState();
}

QSize SourceCard::pictureSize() const {
  return picture_->size() * picture_->devicePixelRatio();
}

} // namespace recorder
