#pragma once

#include <LumoraKit/platform/UserInterface.h>
#include <LumoraKit/platform/qt/FramedButton.h>
#include <LumoraKit/platform/qt/ServiceComboBox.h>

#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QStackedWidget>
#include <QWidget>
#include <functional>
#include <memory>
#include <string>
#include <utility>

/// \file
/// Widgets as the views that the framework's controllers order. A widget belongs to its parent, as is Qt's way; a view
/// whose widget is gone does nothing and is hidden.

namespace lumora::qt {

/// In units, with the origin in the lower left corner of the parent; see DesignLayout.
Rect frameOf(const QWidget& widget);
void setFrameOf(QWidget& widget, const Rect& frame);

/// By which a widget is found again in a view.
class WidgetHolder {
public:
  virtual ~WidgetHolder();
  virtual QWidget* widget() const = 0;
};

/// What every view has; `Interface` is the view's role.
template <class Interface, class Widget = QWidget> class ViewOf : public Interface, public WidgetHolder {
public:
  explicit ViewOf(Widget* widget) : widget_(widget) {}

  Widget* widget() const override { return widget_; }

  Rect frame() const override { return widget_ ? frameOf(*widget_) : Rect(); }
  void setFrame(const Rect& frame) override {
    if (widget_) {
      setFrameOf(*widget_, frame);
    }
  }
  bool isHidden() const override { return !widget_ || widget_->isHidden(); }
  void setHidden(bool hidden) override {
    if (widget_) {
      widget_->setHidden(hidden);
    }
  }

private:
  const QPointer<Widget> widget_;
};

using PlainView = ViewOf<View>;

/// A view that takes its widget with it.
class OwnedView final : public ViewOf<View> {
public:
  explicit OwnedView(QWidget* widget);
  ~OwnedView() override;
};

/// The marker beside a field: also says so in the field's description, for whoever cannot see it.
class MarkerView final : public ViewOf<View> {
public:
  MarkerView(QWidget* marker, QWidget* field);
  ~MarkerView() override;

  void setHidden(bool hidden) override;

private:
  const QPointer<QWidget> field_;
};

class FieldView final : public ViewOf<TextField, QLineEdit> {
public:
  explicit FieldView(QLineEdit* field);
  ~FieldView() override;

  std::string stringValue() const override;
  void setStringValue(const std::string& text) override;
  void makeFirstResponder() override;
  void endEditing() override;
};

class ComboBoxView final : public ViewOf<ComboBox, ServiceComboBox> {
public:
  explicit ComboBoxView(ServiceComboBox* comboBox);
  ~ComboBoxView() override;

  std::string stringValue() const override;
  void setStringValue(const std::string& text) override;
  void makeFirstResponder() override;
  void endEditing() override;
  void addItem(const std::string& item) override;
  void removeItem(const std::string& item) override;
};

class ButtonView final : public ViewOf<Button, FramedButton> {
public:
  /// \param titleChanged told after each title
  ButtonView(FramedButton* button, std::function<void()> titleChanged);
  ~ButtonView() override;

  void setTitle(const std::string& title) override;
  void sizeToFit() override;

private:
  const std::function<void()> titleChanged_;
};

/// As large as the design has it, in the style's own drawing.
void showCautionIcon(QLabel& label);

class StandardImageView final : public ViewOf<ImageView, QLabel> {
public:
  explicit StandardImageView(QLabel* label);
  ~StandardImageView() override;

  void setImage(SystemImage image) override;
};

class PagesView final : public ViewOf<TabView, QStackedWidget> {
public:
  explicit PagesView(QStackedWidget* pages);
  ~PagesView() override;

  void selectPage(int page) override;
};

class Container final : public ViewOf<ContainerView> {
public:
  /// \param subviewChanged told of the widget that was put in
  Container(QWidget* container, std::function<void(QWidget*)> subviewChanged);
  ~Container() override;

  void setSubview(const std::shared_ptr<View>& view) override;

private:
  const std::function<void(QWidget*)> subviewChanged_;
  QPointer<QWidget> subview_;
};

} // namespace lumora::qt
