#include <LumoraKit/platform/UserInterface.h>

namespace lumora {
namespace {

class NoUserInterface final : public UserInterface {
public:
  ServerLoginView loadServerLoginView(const std::shared_ptr<LMRServerLoginViewController>&) override { return {}; }
  ServerLoginWindow loadServerLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>&) override { return {}; }
  void beep() override {}
};

} // namespace

View::View() = default;
View::~View() = default;
TextField::TextField() = default;
TextField::~TextField() = default;
ComboBox::ComboBox() = default;
ComboBox::~ComboBox() = default;
Button::Button() = default;
Button::~Button() = default;
ImageView::ImageView() = default;
ImageView::~ImageView() = default;
TabView::TabView() = default;
TabView::~TabView() = default;
ContainerView::ContainerView() = default;
ContainerView::~ContainerView() = default;
Window::Window() = default;
Window::~Window() = default;
UserInterface::~UserInterface() = default;

std::shared_ptr<UserInterface> UserInterface::none() {
  return std::make_shared<NoUserInterface>();
}

} // namespace lumora
