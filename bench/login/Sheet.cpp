#include "Sheet.h"

#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <QCoreApplication>
#include <QEvent>
#include <optional>

namespace lumora::bench {

PaintWatch::PaintWatch() {
  QCoreApplication::instance()->installEventFilter(this);
}

void PaintWatch::wait() const {
  while (!isPainted_) {
    QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
  }
}

bool PaintWatch::eventFilter(QObject* watched, QEvent* event) {
  isPainted_ = isPainted_ || (event->type() == QEvent::Paint && qobject_cast<QDialog*>(watched) != nullptr);
  return false;
}

Sheet::Sheet(QMainWindow& parent) {
  controller_
      ->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
          qt::windowOf(&parent), std::nullopt, std::nullopt, delegate_, &Delegate::ended, {});
}

QDialog& Sheet::dialog() const {
  return *qobject_cast<QDialog*>(qt::widgetOf(controller_->outlets().defaultButton)->window());
}

void settle() {
  QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
  QCoreApplication::processEvents();
}

} // namespace lumora::bench
