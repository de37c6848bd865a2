#include "../record-episode/Stage.h"
#include "Machine.h"
#include "Robot.h"
#include "Tour.h"
#include "support/ChildProgram.h"
#include "support/TestDesktop.h"

#include <LumoraKit/LumoraKit.h>

#include <QApplication>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <iostream>
#include <optional>
#include <string>
#include <vector>

namespace {

using lumora::tests::TestDesktop;
using stage::Failure;

std::filesystem::path newFolder() {
  std::string name = std::filesystem::temp_directory_path() / "lumora-login-pictures-XXXXXX";
  if (mkdtemp(name.data()) == nullptr) {
    throw Failure{"No folder for the pictures could be made beside " + name + "."};
  }
  return name;
}

// A screen that nobody sees, with the style that Qt has everywhere.
void startDesktop(TestDesktop& desktop) {
  if (const auto obstacle = TestDesktop::obstacle()) {
    throw Failure{"There is no display, and none can be started: " + *obstacle + "."};
  }
  if (!desktop.start()) {
    throw Failure{"There is no display, and Xvfb or jwm does not start."};
  }
  unsetenv("WAYLAND_DISPLAY");
  setenv("QT_QPA_PLATFORM", "xcb", 1);
  setenv("QT_STYLE_OVERRIDE", "fusion", 1);
}

void show(int argc, char** argv, const std::optional<std::filesystem::path>& pictures) {
  TestDesktop desktop;
  const bool isAlone = pictures || !TestDesktop::isThereOne();
  if (isAlone) {
    startDesktop(desktop);
  }
  const QApplication application(argc, argv);
  tour::Machine machine;
  std::optional<tour::Robot> robot;
  if (isAlone) {
    robot.emplace(machine, pictures ? *pictures : newFolder());
    std::cout << "Nobody sits before a screen here: a robot uses the sheet.\n";
  }
  tour::Tour(machine, robot ? &*robot : nullptr).run();
  if (robot) {
    std::cout << "\nPictures: " << robot->folder().string() << '\n';
  }
}

} // namespace

// login-tour [--pictures FOLDER]: under the user's display the user logs in. Without one, or when pictures are wanted,
// a robot does, on a display of its own.
int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  const bool wantsPictures = arguments.size() == 2 && arguments.front() == "--pictures";
  if (!arguments.empty() && !wantsPictures) {
    std::cerr << "usage: login-tour [--pictures FOLDER]\n";
    return 2;
  }
  lumora::Application::setIdentity("org.vantor.lumora.login-tour", "login-tour");
  stage::catchInterrupts();
  lumora::tests::ChildProgram::silenceErrors();
  try {
    show(argc, argv, wantsPictures ? std::optional<std::filesystem::path>(arguments.back()) : std::nullopt);
  } catch (const Failure& failure) {
    std::cerr << failure.sentence << '\n';
    return failure.status;
  } catch (const std::exception& error) {
    std::cerr << "That did not work: " << error.what() << ".\n";
    return 1;
  }
  return 0;
}
