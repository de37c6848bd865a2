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
  void add(std::string order) { orders_.push_back(std::move(order)); }
  const std::vector<std::string>& all() const { return orders_; }
  void clear() { orders_.clear(); }

private:
  std::vector<std::string> orders_;
};

/// What every fake view has; `Interface` is the view's role.
template <class Interface> class FakeViewOf : public Interface {
public:
  FakeViewOf(std::string name, std::shared_ptr<OrderList> orders)
      : name_(std::move(name)), orders_(std::move(orders)) {}

  /// The outlet's name.
  const std::string& name() const { return name_; }

  Rect frame() const override { return frame_; }
  void setFrame(const Rect& frame) override { frame_ = frame; }
  bool isHidden() const override { return isHidden_; }
  void setHidden(bool hidden) override {
    isHidden_ = hidden;
    note((hidden ? "hide " : "show ") + name_);
  }

protected:
  void note(std::string order) { orders_->add(std::move(order)); }

private:
  const std::string name_;
  const std::shared_ptr<OrderList> orders_;
  Rect frame_{0, 0, 100, 20};
  bool isHidden_ = false;
};

using FakeView = FakeViewOf<View>;

/// What every fake field has.
template <class Interface> class FakeFieldOf : public FakeViewOf<Interface> {
public:
  using FakeViewOf<Interface>::FakeViewOf;

  std::string stringValue() const override { return text_; }
  void setStringValue(const std::string& text) override {
    text_ = text;
    this->note(this->name() + ": " + text);
  }
  void makeFirstResponder() override { this->note("focus " + this->name()); }
  void endEditing() override { this->note("end editing " + this->name()); }

  /// Changes the text without an order, as a binding or the user does.
  void show(std::string text) { text_ = std::move(text); }

private:
  std::string text_;
};

using FakeTextField = FakeFieldOf<TextField>;

class LUMORA_EXPORT FakeComboBox final : public FakeFieldOf<ComboBox> {
public:
  FakeComboBox(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeComboBox() override;

  const std::vector<std::string>& items() const { return items_; }

  void addItem(const std::string& item) override;
  void removeItem(const std::string& item) override;

private:
  std::vector<std::string> items_;
};

/// A button whose title needs a width that the test says: 60 unless set.
class LUMORA_EXPORT FakeButton final : public FakeViewOf<Button> {
public:
  FakeButton(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeButton() override;

  const std::string& title() const { return title_; }
  void setFittedWidth(double width) { fittedWidth_ = width; }

  void setTitle(const std::string& title) override;
  void sizeToFit() override;

private:
  std::string title_;
  double fittedWidth_ = 60;
};

class LUMORA_EXPORT FakeImageView final : public FakeViewOf<ImageView> {
public:
  FakeImageView(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeImageView() override;

  void setImage(SystemImage image) override;
};

class LUMORA_EXPORT FakeTabView final : public FakeViewOf<TabView> {
public:
  FakeTabView(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeTabView() override;

  /// The page that is shown; -1 before one was selected.
  int page() const { return page_; }

  void selectPage(int page) override;

private:
  int page_ = -1;
};

class LUMORA_EXPORT FakeContainerView final : public FakeViewOf<ContainerView> {
public:
  FakeContainerView(std::string name, std::shared_ptr<OrderList> orders);
  ~FakeContainerView() override;

  const std::shared_ptr<View>& subview() const { return subview_; }

  void setSubview(const std::shared_ptr<View>& view) override;

private:
  std::shared_ptr<View> subview_;
};

class LUMORA_EXPORT FakeWindow final : public Window {
public:
  explicit FakeWindow(std::shared_ptr<OrderList> orders = std::make_shared<OrderList>());
  ~FakeWindow() override;

  /// Whether it is on the screen, as a sheet or by itself.
  bool isShown() const { return isShown_; }
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
