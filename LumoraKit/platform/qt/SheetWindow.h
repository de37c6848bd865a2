#pragma once

#include <LumoraKit/platform/UserInterface.h>
#include <LumoraKit/platform/qt/LoginWindow.h>

#include <QPointer>
#include <QWidget>
#include <QWindow>
#include <memory>

/// \file
/// The windows that the framework's controllers know.

namespace lumora::qt {

/// A window of the application.
class ApplicationWindow final : public Window {
public:
  explicit ApplicationWindow(QWidget* widget);
  explicit ApplicationWindow(QWindow* window);
  ~ApplicationWindow() override;

  /// Null when it is gone, or is none of widgets.
  QWidget* widget() const { return widget_; }
  QWindow* window() const { return window_; }

  Rect frame() const override;
  void setFrame_display_animate(const Rect& frame, bool display, bool animate) override;
  bool isSheet() const override { return false; }
  void beginSheet(const std::shared_ptr<Window>& parent, DidEnd didEnd) override;
  void endSheet(int returnCode) override;

private:
  const QPointer<QWidget> widget_;
  const QPointer<QWindow> window_;
};

/// The login window, which goes with this object. When it is destroyed by its parent, the sheet is cancelled.
class SheetWindow final : public Window, public std::enable_shared_from_this<SheetWindow> {
public:
  SheetWindow(LoginWindow* window, const std::shared_ptr<LMRServerLoginSheetController>& owner);
  ~SheetWindow() override;

  LoginWindow* window() const { return window_; }

  /// In units; a title bar counts as the 22 units that the controller reckons with. Where the window lies is up to its
  /// parent, or to the window manager.
  Rect frame() const override;
  void setFrame_display_animate(const Rect& frame, bool display, bool animate) override;
  bool isSheet() const override { return isSheet_; }
  void beginSheet(const std::shared_ptr<Window>& parent, DidEnd didEnd) override;
  void endSheet(int returnCode) override;

private:
  double titleBar() const;
  void cancelLater();

  const QPointer<LoginWindow> window_;
  const std::weak_ptr<LMRServerLoginSheetController> owner_;
  bool isSheet_ = false;
  DidEnd didEnd_;
  QMetaObject::Connection windowDestroyed_;
};

} // namespace lumora::qt
