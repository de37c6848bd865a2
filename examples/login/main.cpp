#include <LumoraKit/LumoraKit.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <QApplication>
#include <QMainWindow>
#include <iostream>

struct Recorder {
  void loginEnded(int returnCode) const {
    if (returnCode == LMRServerLoginSheetController::LoggedIn) {
      const auto session = sheet.serverLoginViewController()->loginSession();
      std::cout << session->description() << ", " << session->userFullName().value_or("") << '\n';
    }
    QApplication::quit();
  }
  LMRServerLoginSheetController& sheet;
};

// Shows the login sheet over a window, and prints the session: login [ROOT OF A SANDBOX].
int main(int argc, char** argv) {
  QApplication application(argc, argv);
  lumora::qt::install();
  if (argc > 1) {
    auto platform = lumora::Platform::current();
    platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(argv[1], platform.toolRunner);
    lumora::Platform::install(platform);
  }
  QMainWindow window;
  window.resize(640, 420);
  window.show();
  const auto sheet = std::make_shared<LMRServerLoginSheetController>();
  const auto recorder = std::make_shared<Recorder>(Recorder{*sheet});
  sheet->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      lumora::qt::windowOf(&window), std::nullopt, std::nullopt, recorder, &Recorder::loginEnded, {});
  return QApplication::exec();
}
