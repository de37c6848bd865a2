#include "recorder/window/SubmissionList.h"

#include "recorder/window/Colours.h"
#include "recorder/window/Icons.h"
#include "recorder/window/LineDelegate.h"
#include "recorder/window/Words.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QMessageBox>
#include <QSignalBlocker>
#include <QVBoxLayout>

namespace recorder {
namespace {

// The parts of an episode have the same title.
QString titleOf(const LMRSubmission& submission) {
  const auto title =
      QString::fromStdString(submission.userMetadata.string(LMREpisodeUserMetadataTitleKey).value_or(""));
  const auto name = QString::fromStdString(submission.name);
  return name.isEmpty() ? title : words("%1 – %2").arg(title, name);
}

QString reasonOf(const LMRSubmission& submission) {
  return QString::fromStdString(submission.lastError.value_or(""));
}

} // namespace

SubmissionList::SubmissionList(std::shared_ptr<Studio> studio, QWidget* parent)
    : QWidget(parent), studio_(std::move(studio)), list_(new QListWidget(this)),
      retry_(new QPushButton(words("Submit Now"), this)), remove_(new QPushButton(words("Remove…"), this)) {
  build();
  connect(list_, &QListWidget::itemSelectionChanged, this, [this] { selectionChanged(); });
  connect(retry_, &QPushButton::clicked, this, [this] { studio_->submissions().retry(selected().toStdString()); });
  connect(remove_, &QPushButton::clicked, this, [this] { removeSelected(); });
  refresh();
}

void SubmissionList::build() {
  auto* const label = new QLabel(words("Su&bmissions"), this);
  label->setBuddy(list_);
  list_->setObjectName("submissions");
  list_->setAccessibleName(words("Submissions"));
  list_->setItemDelegate(new LineDelegate(list_));
  // Also asks for the lines' heights anew when a scroll bar leaves them less room.
  list_->setWordWrap(true);
  list_->setIconSize(QSize(fontMetrics().ascent(), fontMetrics().ascent()));
  list_->setSpacing(3);
  list_->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
  list_->setMinimumHeight(fontMetrics().height() * 5);
  retry_->setObjectName("submitNow");
  remove_->setObjectName("removeSubmission");
  auto* const buttons = new QHBoxLayout;
  buttons->addWidget(retry_);
  buttons->addWidget(remove_);
  buttons->addStretch();
  auto* const layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->addWidget(label);
  layout->addWidget(list_, 1);
  layout->addLayout(buttons);
}

QString SubmissionList::selected() const {
  const auto items = list_->selectedItems();
  return items.isEmpty() ? QString() : items.front()->data(Qt::UserRole).toString();
}

// The selection stays with its submission.
void SubmissionList::refresh() {
  const QString before = selected();
  const QSignalBlocker blocker(list_);
  list_->clear();
  for (const LMRSubmission& submission : studio_->submissions().waiting()) {
    addSubmission(submission);
  }
  for (const LMRSubmission& submission : studio_->submissions().submitted()) {
    addLine(titleOf(submission), words("Arrived at the server"), colourOf(Signal::Good, palette()), {});
  }
  for (const Transfer& transfer : studio_->submissions().transfers()) {
    addTransfer(transfer);
  }
  if (list_->count() == 0) {
    addLine(words("Nothing yet"), words("Recordings on their way to the server appear here."), QColor(), {});
    list_->item(0)->setFlags(Qt::NoItemFlags);
  }
  for (int i = 0; i < list_->count(); ++i) {
    list_->item(i)->setSelected(!before.isEmpty() && list_->item(i)->data(Qt::UserRole).toString() == before);
  }
  selectionChanged();
}

void SubmissionList::addSubmission(const LMRSubmission& submission) {
  const QString identifier = QString::fromStdString(submission.identifier);
  if (submission.state == LMRSubmission::State::Submitting) {
    addLine(titleOf(submission), words("Is being submitted…"), colourOf(Signal::Busy, palette()), identifier);
  } else if (submission.state == LMRSubmission::State::Held) {
    addLine(titleOf(submission), words("Not submitted: %1").arg(reasonOf(submission)),
            colourOf(Signal::Danger, palette()), identifier);
  } else if (submission.lastError) {
    addLine(titleOf(submission), words("Will be tried again: %1").arg(reasonOf(submission)),
            colourOf(Signal::Warning, palette()), identifier);
  } else {
    addLine(titleOf(submission), words("Waits for its turn"), colourOf(Signal::Quiet, palette()), identifier);
  }
}

void SubmissionList::addTransfer(const Transfer& transfer) {
  const QString title = QString::fromStdString(transfer.title);
  if (transfer.state == "completed") {
    addLine(title, words("Arrived at the server"), colourOf(Signal::Good, palette()), {});
  } else if (transfer.state == "failed") {
    addLine(title, words("Not transferred: %1").arg(QString::fromStdString(transfer.message)),
            colourOf(Signal::Danger, palette()), {});
  } else {
    const double part = transfer.size > 0 ? static_cast<double>(transfer.sent) / static_cast<double>(transfer.size) : 0;
    addLine(title, words("Is being transferred: %1 %").arg(static_cast<int>(part * 100)),
            colourOf(Signal::Busy, palette()), {});
  }
}

void SubmissionList::addLine(const QString& title, const QString& state, const QColor& colour,
                             const QString& identifier) {
  auto* const item = new QListWidgetItem(title + '\n' + state, list_);
  item->setData(Qt::UserRole, identifier);
  item->setToolTip(state);
  if (colour.isValid()) {
    item->setIcon(signIcon(Shape::Dot, colour));
  }
}

void SubmissionList::selectionChanged() {
  const std::string identifier = selected().toStdString();
  bool mayChange = false;
  for (const LMRSubmission& submission : studio_->submissions().waiting()) {
    mayChange =
        mayChange || (submission.identifier == identifier && submission.state != LMRSubmission::State::Submitting);
  }
  retry_->setEnabled(mayChange);
  remove_->setEnabled(mayChange);
}

void SubmissionList::removeSelected() {
  const std::string identifier = selected().toStdString();
  QMessageBox box(QMessageBox::Question, words("Remove Submission"), words("Remove this submission from the list?"),
                  QMessageBox::NoButton, window());
  box.setInformativeText(words("It will not reach the server. The recorded file stays on this computer."));
  auto* const remove = box.addButton(words("Remove"), QMessageBox::DestructiveRole);
  box.setDefaultButton(box.addButton(words("Keep"), QMessageBox::RejectRole));
  box.exec();
  if (box.clickedButton() == remove) {
    studio_->submissions().remove(identifier);
  }
}

} // namespace recorder
