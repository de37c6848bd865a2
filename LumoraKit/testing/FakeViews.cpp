#include <LumoraKit/platform/Log.h>
#include <LumoraKit/testing/FakeViews.h>

#include <algorithm>

namespace lumora::fakes {

FakeComboBox::FakeComboBox(std::string name, std::shared_ptr<OrderList> orders)
    : FakeFieldOf(std::move(name), std::move(orders)) {}
FakeComboBox::~FakeComboBox() = default;

void FakeComboBox::addItem(const std::string& item) {
  items_.push_back(item);
}

void FakeComboBox::removeItem(const std::string& item) {
  std::erase(items_, item);
}

FakeButton::FakeButton(std::string name, std::shared_ptr<OrderList> orders)
    : FakeViewOf(std::move(name), std::move(orders)) {}
FakeButton::~FakeButton() = default;

void FakeButton::setTitle(const std::string& title) {
  title_ = title;
  note(name() + ": " + title);
}

void FakeButton::sizeToFit() {
  Rect fitted = frame();
  fitted.width = fittedWidth_;
  setFrame(fitted);
}

FakeImageView::FakeImageView(std::string name, std::shared_ptr<OrderList> orders)
    : FakeViewOf(std::move(name), std::move(orders)) {}
FakeImageView::~FakeImageView() = default;

void FakeImageView::setImage(SystemImage /*image*/) {
  note(name() + ": caution icon");
}

FakeTabView::FakeTabView(std::string name, std::shared_ptr<OrderList> orders)
    : FakeViewOf(std::move(name), std::move(orders)) {}
FakeTabView::~FakeTabView() = default;

void FakeTabView::selectPage(int page) {
  page_ = page;
  note("page " + std::to_string(page));
}

FakeContainerView::FakeContainerView(std::string name, std::shared_ptr<OrderList> orders)
    : FakeViewOf(std::move(name), std::move(orders)) {}
FakeContainerView::~FakeContainerView() = default;

void FakeContainerView::setSubview(const std::shared_ptr<View>& view) {
  subview_ = view;
  note(name() + " holds its view");
}

FakeWindow::FakeWindow(std::shared_ptr<OrderList> orders) : orders_(std::move(orders)) {}
FakeWindow::~FakeWindow() = default;

void FakeWindow::resize(double width, double height) {
  frame_.width = width;
  frame_.height = height;
}

void FakeWindow::setFrame_display_animate(const Rect& frame, bool display, bool animate) {
  frame_ = frame;
  orders_->add(
      format("window frame %@ %@ %@ %@%@%@", {text(frame.x), text(frame.y), text(frame.width), text(frame.height),
                                              display ? ", redrawn" : "", animate ? ", animated" : ""}));
}

void FakeWindow::beginSheet(const std::shared_ptr<Window>& parent, DidEnd didEnd) {
  isShown_ = true;
  parent_ = parent;
  didEnd_ = std::move(didEnd);
  orders_->add(parent ? "begin sheet" : "show window");
}

void FakeWindow::endSheet(int returnCode) {
  if (!std::exchange(isShown_, false)) {
    return;
  }
  orders_->add("end sheet " + std::to_string(returnCode));
  parent_ = nullptr;
  if (const auto didEnd = std::exchange(didEnd_, nullptr)) {
    didEnd(returnCode);
  }
}

} // namespace lumora::fakes
