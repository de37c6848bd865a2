// The example of lumorakit-qt.

#include <LumoraKit/LumoraKit.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <memory>
#include <optional>

#include <QtWidgets/QApplication>
#include <QtWidgets/QMainWindow>

namespace {

struct Owner {
  void loginEnded(int returnCode);
};

void Owner::loginEnded(int /*returnCode*/) {}

} // namespace

int main(int argc, char** argv) {
  QApplication application(argc, argv);
  lumora::qt::install();
  QMainWindow mainWindow;
  const auto sheet = std::make_shared<LMRServerLoginSheetController>();
  sheet->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      lumora::qt::windowOf(&mainWindow), std::nullopt, std::nullopt, std::make_shared<Owner>(), &Owner::loginEnded, {});
  return QApplication::exec();
}
