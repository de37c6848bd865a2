#pragma once

#include <LumoraKit/login/LMRServerLoginSheetController.h>

#include <QComboBox>
#include <QDialog>
#include <QMainWindow>
#include <QObject>
#include <memory>

namespace lumora::bench {

/// Notices the first paint of a dialog after reset(). One a program, for its QApplication.
class PaintWatch : public QObject {
public:
  PaintWatch();

  void reset() { isPainted_ = false; }
  /// Serves the application's events until a dialog is on the screen.
  void wait() const;

protected:
  bool eventFilter(QObject* watched, QEvent* event) override;

private:
  bool isPainted_ = false;
};

/// The login sheet over a window.
class Sheet {
public:
  /// The call that is measured.
  explicit Sheet(QMainWindow& parent);

  QDialog& dialog() const;
  QComboBox& comboBox() const { return *dialog().findChild<QComboBox*>("serverComboBox"); }

private:
  struct Delegate {
    void ended(int /*returnCode*/) {}
  };

  std::shared_ptr<Delegate> delegate_ = std::make_shared<Delegate>();
  std::shared_ptr<LMRServerLoginSheetController> controller_ = std::make_shared<LMRServerLoginSheetController>();
};

/// Whatever was to be deleted later, and all that is under way.
void settle();

} // namespace lumora::bench
