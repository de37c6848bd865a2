#include "recorder/window/RecorderWindow.h"
#include "recorder/window/Words.h"

#include <LumoraKit/LumoraKit.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <QApplication>
#include <QCommandLineParser>
#include <QIcon>

// Lumora Recorder.
int main(int argc, char** argv) {
  lumora::Application::setIdentity("org.vantor.lumora.recorder", "Lumora Recorder");
  QApplication application(argc, argv);
  QApplication::setApplicationName("lumora-recorder");
  QApplication::setApplicationDisplayName("Lumora Recorder");
  QApplication::setDesktopFileName("org.vantor.lumora.recorder");
  QApplication::setWindowIcon(QIcon(":/lumora-recorder.svg"));
  QCommandLineParser parser;
  parser.setApplicationDescription("Records an episode and submits it to a Lumora server.");
  parser.addHelpOption();
  parser.addOption({"sandbox", "reaches the server that lumora-sandbox made in a folder", "folder"});
  parser.process(application);

  lumora::qt::install();
  if (parser.isSet("sandbox")) {
    auto platform = lumora::Platform::current();
    platform.toolRunner =
        std::make_shared<lumora::RootedToolRunner>(parser.value("sandbox").toStdString(), platform.toolRunner);
    lumora::Platform::install(platform);
  }
  QApplication::setLayoutDirection(recorder::textDirection());
  recorder::RecorderWindow window;
  window.show();
  window.logIn();
  return QApplication::exec();
}
