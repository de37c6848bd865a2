#include "Administration.h"

#include "Commands.h"

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <stdexcept>
#include <system_error>

#include <unistd.h>

namespace lumora::sandbox {

namespace {

std::string firstLine(std::istream& stream) {
  std::string line;
  if (!std::getline(stream, line) || line.empty()) {
    throw std::runtime_error("no password was given");
  }
  return line;
}

} // namespace

void addRootArgument(CLI::App& command, std::string& root) {
  command.add_option("ROOT", root, "the server's root folder")->required();
}

void addPasswordOption(CLI::App& command, std::string& path) {
  command.add_option("--password-file", path, "file whose first line is the password; - is standard input")
      ->default_val("-");
}

std::string readPassword(const std::string& path) {
  if (path == "-") {
    return firstLine(std::cin);
  }
  std::ifstream file(path);
  if (!file) {
    throw std::runtime_error("the password file " + path + " cannot be read");
  }
  return firstLine(file);
}

void becomeProgram(const std::string& name, std::vector<std::string> arguments) {
  std::string program = std::filesystem::read_symlink("/proc/self/exe").replace_filename(name).string();
  std::vector<char*> words{program.data()};
  for (auto& argument : arguments) {
    words.push_back(argument.data());
  }
  words.push_back(nullptr);
  execv(program.c_str(), words.data());
  throw std::system_error(errno, std::generic_category(), program);
}

int administrate(int argc, char** argv) {
  constexpr int wrongUse = 2;
  CLI::App program("A stand-in for a Lumora server: makes one, and tells what was submitted to it.", "lumora-sandbox");
  program.require_subcommand(1);
  addCreateCommand(program);
  addUserCommands(program);
  addWorkflowCommands(program);
  addCameraCommands(program);
  addMasterPasswordCommand(program);
  addSingleSignOnCommands(program);
  addEpisodesCommand(program);
  addInjectCommand(program);
  addAgentCommand(program);
  addAnnounceCommand(program);
  try {
    program.parse(argc, argv);
    return 0;
  } catch (const CLI::ParseError& error) {
    return program.exit(error) == 0 ? 0 : wrongUse;
  } catch (const std::exception& error) {
    std::cerr << "lumora-sandbox: " << error.what() << '\n';
    return 1;
  }
}

} // namespace lumora::sandbox
