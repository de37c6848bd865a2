#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/qt/LoginPanel.h>
#include <LumoraKit/platform/qt/LoginWindow.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>
#include <LumoraKit/platform/qt/QtViews.h>

#include <QApplication>
#include <utility>

namespace lumora::qt {
namespace {

class QtUserInterface final : public UserInterface {
public:
  ServerLoginView loadServerLoginView(const std::shared_ptr<LMRServerLoginViewController>& owner) override {
    return loadLoginPanel(owner);
  }
  ServerLoginWindow loadServerLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner) override {
    return loadLoginWindow(owner);
  }
  void beep() override { QApplication::beep(); }
};

} // namespace

void install() {
  Platform platform = Platform::current();
  platform.setMainThread(makeMainThread());
  platform.userInterface = makeUserInterface();
  Platform::install(std::move(platform));
}

std::shared_ptr<UserInterface> makeUserInterface() {
  assertThat(qobject_cast<QApplication*>(QCoreApplication::instance()) != nullptr, "there is a QApplication",
             "makeUserInterface", "LumoraKitQt");
  return std::make_shared<QtUserInterface>();
}

QWidget* widgetOf(const std::shared_ptr<View>& view) {
  const auto* const holder = dynamic_cast<const WidgetHolder*>(view.get());
  return holder ? holder->widget() : nullptr;
}

} // namespace lumora::qt
