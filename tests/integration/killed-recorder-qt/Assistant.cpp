#include "Assistant.h"

namespace lumora::tests {
namespace {

constexpr const char* script = LUMORA_SOURCE_DIR "/tests/integration/killed-recorder-qt/use-controls";
constexpr const char* question = "import gi, shutil; gi.require_version('Atspi', '2.0'); "
                                 "from gi.repository import Atspi; print('there' if shutil.which('xdotool') else '')";

} // namespace

std::optional<std::string> Assistant::obstacle() {
  const auto trial = ChildProgram::start({"/usr/bin/python3", "-c", question});
  if (!trial || trial->readLine() != "there") {
    return "xdotool, or Atspi for Python, is not installed (packages xdotool, at-spi2-core, python3-gi, "
           "gir1.2-atspi-2.0)";
  }
  return std::nullopt;
}

Assistant::Assistant() : program_(ChildProgram::start({script})) {}

std::string Assistant::ask(const std::string& line) {
  program_->writeLine(line);
  return program_->readLine();
}

std::optional<std::string> Assistant::see(const std::string& role, const std::string& name) {
  const std::string answer = ask("see\t" + role + "\t" + name);
  const auto tab = answer.find('\t');
  return tab == std::string::npos ? std::nullopt : std::optional(answer.substr(tab + 1));
}

bool Assistant::press(const std::string& role, const std::string& name) {
  return ask("press\t" + role + "\t" + name) == "yes";
}

bool Assistant::type(const std::string& role, const std::string& name, const std::string& text) {
  return ask("type\t" + role + "\t" + name + "\t" + text) == "yes";
}

void Assistant::key(const std::string& name) {
  ask("key\t" + name);
}

} // namespace lumora::tests
