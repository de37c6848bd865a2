#pragma once

#include <LumoraKit/platform/UserInterface.h>

#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

/// \file
/// Views and windows without a screen: they do what they are told, and write it down. Main thread only.

namespace lumora::fakes {

/// What was ordered of a user interface, in its order, as short sentences: "hide passwordTextField",
/// "focus serverComboBox", "serverComboBox: studio.example.org".
class LUMORA_EXPORT OrderList {
public:
  /// Appends an order.
  void add(std::string order) { orders_.push_back(std::move(order)); }
  /// The orders so far.
  const std::vector<std::string>& all() const { return orders_; }
  /// Forgets the orders so far.
  void clear() { orders_.clear(); }

private:
  std::vector<std::string> orders_;
};

/// What every fake view has; `Interface` is the view's role.
template <class Interface> class FakeViewOf : public Interface {
public:
  /// A view of that outlet, whose orders go into the list.
  FakeViewOf(std::string name, std::shared_ptr<OrderList> orders)
      : name_(std::move(name)), orders_(std::move(orders)) {}

  /// The outlet's name.
  const std::string& name() const { return name_; }

  /// Where the last order put it.
  Rect frame() const override { return frame_; }
  void setFrame(const Rect& frame) override { frame_ = frame; }
  /// Whether the last order hid it.
  bool isHidden() const override { return isHidden_; }
  void setHidden(bool hidden) override {
    isHidden_ = hidden;
    note((hidden ? "hide " : "show ") + name_);
  }

protected:
  /// Appends an order to the list.
  void note(std::string order) { orders_->add(std::move(order)); }

private:
  const std::string name_;
  const std::shared_ptr<OrderList> orders_;
  Rect frame_{0, 0, 100, 20};
  bool isHidden_ = false;
};

/// A view without more to it: a label, a marker, a check box.
using FakeView = FakeViewOf<View>;

/// What every fake field has.
template <class Interface> class FakeFieldOf : public FakeViewOf<Interface> {
public:
  using FakeViewOf<Interface>::FakeViewOf;

  /// The text, as typed or ordered.
  std::string stringValue() const override { return text_; }
  void setStringValue(const std::string& text) override {
    text_ = text;
    this->note(this->name() + ": " + text);
  }
  /// Notes the order "focus", with the outlet's name.
  void makeFirstResponder() override { this->note("focus " + this->name()); }
  /// Notes the order "end editing", with the outlet's name.
  void endEditing() override { this->note("end editing " + this->name()); }

  /// Changes the text without an order, as a binding or the user does.
  void show(std::string text) { text_ = std::move(text); }

private:
  std::string text_;
};

/// A text field.
using FakeTextField = FakeFieldOf<TextField>;

/// A combo box whose list can be read.
class LUMORA_EXPORT FakeComboBox final : public FakeFieldOf<ComboBox> {
public:
  /// An empty one of that outlet.
  FakeComboBox(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeComboBox() override;

  /// The entries of the list, in their order.
  const std::vector<std::string>& items() const { return items_; }

  void addItem(const std::string& item) override;
  void removeItem(const std::string& item) override;

private:
  std::vector<std::string> items_;
};

/// A button whose title needs a width that the test says: 60 unless set.
class LUMORA_EXPORT FakeButton final : public FakeViewOf<Button> {
public:
  /// A button of that outlet, without a title.
  FakeButton(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeButton() override;

  /// The title that was ordered last.
  const std::string& title() const { return title_; }
  /// From now on a title needs this width.
  void setFittedWidth(double width) { fittedWidth_ = width; }

  void setTitle(const std::string& title) override;
  void sizeToFit() override;

private:
  std::string title_;
  double fittedWidth_ = 60;
};

/// A picture that notes what it is to show.
class LUMORA_EXPORT FakeImageView final : public FakeViewOf<ImageView> {
public:
  /// One of that outlet.
  FakeImageView(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeImageView() override;

  void setImage(SystemImage image) override;
};

/// Pages that remember which one is shown.
class LUMORA_EXPORT FakeTabView final : public FakeViewOf<TabView> {
public:
  /// One of that outlet, with no page chosen.
  FakeTabView(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeTabView() override;

  /// The page that is shown; -1 before one was selected.
  int page() const { return page_; }

  void selectPage(int page) override;

private:
  int page_ = -1;
};

/// A container that remembers what it holds.
class LUMORA_EXPORT FakeContainerView final : public FakeViewOf<ContainerView> {
public:
  /// An empty one of that outlet.
  FakeContainerView(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeContainerView() override;

  /// What was put into it last; null before.
  const std::shared_ptr<View>& subview() const { return subview_; }

  void setSubview(const std::shared_ptr<View>& view) override;

private:
  std::shared_ptr<View> subview_;
};

/// A window without a screen.
class LUMORA_EXPORT FakeWindow final : public Window {
public:
  /// A window that is not shown. Without a list of its own it notes its orders for itself.
  explicit FakeWindow(std::shared_ptr<OrderList> orders = std::make_shared<OrderList>());
  ~FakeWindow() override;

  /// Whether it is on the screen, as a sheet or by itself.
  bool isShown() const { return isShown_; }
  /// The window that it hangs from as a sheet; null when there is none.
  const std::shared_ptr<Window>& parent() const { return parent_; }
  /// Without an order, as the user drags it.
  void resize(double width, double height);

  Rect frame() const override { return frame_; }
  void setFrame_display_animate(const Rect& frame, bool display, bool animate) override;
  bool isSheet() const override { return isShown_ && parent_ != nullptr; }
  void beginSheet(const std::shared_ptr<Window>& parent, DidEnd didEnd) override;
  void endSheet(int returnCode) override;

private:
  const std::shared_ptr<OrderList> orders_;
  Rect frame_{40, 40, 420, 200};
  bool isShown_ = false;
  std::shared_ptr<Window> parent_;
  DidEnd didEnd_;
};

} // namespace lumora::fakes
