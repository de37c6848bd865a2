// How a recording ends, and what the window asks then.
#include "recorder/window/RecorderWindow.h"
#include "recorder/window/Words.h"

#include <QCloseEvent>
#include <QDateTime>
#include <QLocale>
#include <QMessageBox>
#include <algorithm>

namespace recorder {

void RecorderWindow::stop() {
  if (studio_->take()) {
    studio_->take()->stop(episode_->episode());
  }
}

void RecorderWindow::askToDiscard() {
  QMessageBox box(QMessageBox::Warning, words("Discard Recording"), words("Discard this recording?"),
                  QMessageBox::NoButton, this);
  box.setInformativeText(words("It is deleted from this computer and does not reach the server."));
  auto* const discard = box.addButton(words("Discard"), QMessageBox::DestructiveRole);
  box.setDefaultButton(box.addButton(words("Keep Recording"), QMessageBox::RejectRole));
  box.exec();
  if (box.clickedButton() == discard && studio_->take()) {
    studio_->take()->cancel();
  }
}

void RecorderWindow::askToStopWithoutServer() {
  isAskingAboutServer_ = true;
  QMessageBox box(QMessageBox::Warning, words("Server Not Reached"),
                  words("The server did not take the recording. It goes on meanwhile."), QMessageBox::NoButton, this);
  box.setInformativeText(QString::fromStdString(studio_->notice()));
  auto* const again = box.addButton(words("Try Again"), QMessageBox::AcceptRole);
  auto* const keep = box.addButton(words("Stop and Keep the Files Here"), QMessageBox::DestructiveRole);
  box.setEscapeButton(box.addButton(words("Keep Recording"), QMessageBox::RejectRole));
  box.setDefaultButton(again);
  box.exec();
  if (const auto take = studio_->take(); take && box.clickedButton() == again) {
    stop();
  } else if (take && box.clickedButton() == keep) {
    take->stopWithoutServer();
  } else {
    isLeaving_ = false;
  }
  isAskingAboutServer_ = studio_->take() && studio_->take()->hasNoPlaceAtServer();
}

// Escape leaves it for the next start.
void RecorderWindow::askAboutInterrupted() {
  isAskingAboutInterrupted_ = true;
  const LMRRecordingNote& note = studio_->recovery().found()->note();
  const QString title = QString::fromStdString(note.userMetadata.string(LMREpisodeUserMetadataTitleKey).value_or(""));
  const auto began = QDateTime::fromSecsSinceEpoch(note.began.time_since_epoch().count());
  const QLocale locale(QString::fromStdString(lumora::Platform::current().application->language()));
  QMessageBox box(QMessageBox::Question, words("Interrupted Recording"), words("A recording was interrupted."),
                  QMessageBox::NoButton, this);
  box.setInformativeText(
      words("“%1”, begun on %2, is still on this computer.").arg(title, locale.toString(began, QLocale::ShortFormat)));
  auto* const submit = box.addButton(words("Submit"), QMessageBox::AcceptRole);
  auto* const keep = box.addButton(words("Keep the Files"), QMessageBox::ActionRole);
  auto* const discard = box.addButton(words("Discard"), QMessageBox::DestructiveRole);
  box.setEscapeButton(box.addButton(words("Later"), QMessageBox::RejectRole));
  box.setDefaultButton(submit);
  box.exec();
  isAskingAboutInterrupted_ = false;
  if (box.clickedButton() == submit) {
    studio_->submitUnfinished();
  } else if (box.clickedButton() == keep) {
    studio_->keepUnfinished();
  } else if (box.clickedButton() == discard) {
    studio_->discardUnfinished();
  } else {
    studio_->leaveUnfinished();
  }
}

bool RecorderWindow::mayClose() {
  QMessageBox box(QMessageBox::Question, words("Recording Under Way"), words("A recording is under way."),
                  QMessageBox::NoButton, this);
  box.setInformativeText(words("What shall become of it?"));
  auto* const submit = box.addButton(words("Stop and Submit"), QMessageBox::AcceptRole);
  auto* const discard = box.addButton(words("Discard"), QMessageBox::DestructiveRole);
  auto* const stay = box.addButton(words("Keep Recording"), QMessageBox::RejectRole);
  box.setDefaultButton(stay);
  box.exec();
  isLeaving_ = box.clickedButton() == submit || box.clickedButton() == discard;
  if (box.clickedButton() == submit) {
    stop();
  } else if (box.clickedButton() == discard && studio_->take()) {
    studio_->take()->cancel();
  }
  return !studio_->isUnderWay();
}

void RecorderWindow::closeEvent(QCloseEvent* event) {
  event->setAccepted(!studio_->isUnderWay() || mayClose());
}

// What waits for a later try stays on the disk for the next start.
void RecorderWindow::closeWhenDone() {
  const auto waiting = studio_->submissions().waiting();
  const bool isSubmitting = std::ranges::any_of(waiting, [](const LMRSubmission& each) {
    return each.state == LMRSubmission::State::Submitting ||
           (each.state == LMRSubmission::State::Waiting && each.attempts == 0 && !each.lastError);
  });
  if (isLeaving_ && !studio_->isUnderWay() && !isSubmitting) {
    isLeaving_ = false;
    close();
  }
}

} // namespace recorder
