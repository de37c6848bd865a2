#pragma once

#include <LumoraKit/login/LMRServerLoginSheetController.h>
#include <LumoraKit/platform/Observable.h>
#include <LumoraKit/platform/UserInterface.h>

#include <QDialog>
#include <QPointer>
#include <QVariantAnimation>
#include <QWindow>
#include <functional>
#include <memory>
#include <vector>

class QEvent;
class QPaintEvent;

namespace Ui {
class ServerLoginWindow;
}

namespace lumora::qt {

/// The interface file "ServerLoginWindow" with its bindings: a dialog, or a sheet that hangs below the title bar of
/// another window, follows it and blocks it. On Wayland, where no window may place itself, a sheet is a dialog too.
class LoginWindow final : public QDialog {
public:
  explicit LoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner);
  LoginWindow(const LoginWindow&) = delete;
  LoginWindow& operator=(const LoginWindow&) = delete;
  ~LoginWindow() override;

  /// The views of the widgets but for the window itself. To be called once.
  ServerLoginWindow makeOutlets();

  /// In units, of what is inside of the frame.
  double contentHeight() const { return contentHeight_; }
  void setContentHeight(double height, bool animate);

  /// Appears as the sheet of a window, which is given either way; as a window of its own without one.
  void present(QWidget* parentWidget, QWindow* parentWindow);
  /// Disappears, and reports nothing more.
  void end();

  bool eventFilter(QObject* watched, QEvent* event) override;

protected:
  void reject() override;
  void changeEvent(QEvent* event) override;
  void paintEvent(QPaintEvent* event) override;

private:
  void bindButtons();
  void bindPages();
  void showTexts();
  void adopt(QWidget* panel);
  void fitWidth();
  void fitProgressText();
  void fit();
  QObject* followed() const;
  void stopFollowing();
  QRect geometryOfParent() const;
  void hangFromParent();
  void takeKeyboardBack();

  const std::weak_ptr<LMRServerLoginSheetController> owner_;
  const std::unique_ptr<Ui::ServerLoginWindow> ui_;
  std::vector<Connection> bindings_;
  QPointer<QWidget> panel_;
  double contentHeight_ = 0;
  QVariantAnimation growth_;
  QPointer<QWindow> parentWindow_;
  bool isHanging_ = false;
};

/// A new window and its views; it goes with the view `window`.
ServerLoginWindow loadLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner);

} // namespace lumora::qt
