#include "Helper.h"

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <map>

#include <fcntl.h>
#include <sys/resource.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

using Arguments = std::vector<std::string>;

void writeWhole(int descriptor, std::string_view text) {
  while (!text.empty()) {
    const ssize_t written = write(descriptor, text.data(), text.size());
    if (written < 0) {
      _exit(EXIT_FAILURE);
    }
    text.remove_prefix(static_cast<std::size_t>(written));
  }
}

int listDescriptors(const Arguments&) {
  for (int descriptor = 0; descriptor < 1024; ++descriptor) {
    if (fcntl(descriptor, F_GETFD) >= 0) {
      std::cout << descriptor << ' ';
    }
  }
  return EXIT_SUCCESS;
}

int showSignals(const Arguments&) {
  sigset_t blocked;
  pthread_sigmask(SIG_SETMASK, nullptr, &blocked);
  for (const int signal : {SIGUSR1, SIGUSR2}) {
    struct sigaction action {};
    sigaction(signal, nullptr, &action);
    std::cout << (sigismember(&blocked, signal) == 1 ? "blocked " : "open ")
              << (action.sa_handler == SIG_IGN ? "ignored " : "default ");
  }
  return EXIT_SUCCESS;
}

int echoTwice(const Arguments&) {
  std::string buffer(1 << 16, '\0');
  while (true) {
    const ssize_t count = read(STDIN_FILENO, buffer.data(), buffer.size());
    if (count <= 0) {
      return count == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
    }
    const auto part = std::string_view(buffer).substr(0, static_cast<std::size_t>(count));
    writeWhole(STDOUT_FILENO, part);
    writeWhole(STDERR_FILENO, part);
  }
}

int emit(const Arguments& counts) {
  const std::string block(10'000, 'x');
  auto output = std::stoul(counts.at(0));
  auto error = std::stoul(counts.at(1));
  while (output + error > 0) {
    const auto outputPart = std::min(output, block.size());
    const auto errorPart = std::min(error, block.size());
    writeWhole(STDOUT_FILENO, std::string_view(block).substr(0, outputPart));
    writeWhole(STDERR_FILENO, std::string_view(block).substr(0, errorPart));
    output -= outputPart;
    error -= errorPart;
  }
  return EXIT_SUCCESS;
}

int die(const Arguments& signal) {
  const rlimit none{0, 0};
  setrlimit(RLIMIT_CORE, &none);
  const int number = std::stoi(signal.at(0));
  std::signal(number, SIG_DFL);
  raise(number);
  return EXIT_FAILURE;
}

int closeStandard(const Arguments& mask) {
  const auto bits = std::stoul(mask.at(0));
  for (int descriptor = 0; descriptor < 3; ++descriptor) {
    if ((bits >> static_cast<unsigned>(descriptor) & 1U) != 0) {
      close(descriptor);
    }
  }
  const auto done = runShell("cat; echo error >&2; exit 3", "input");
  return done.status == 3 && done.output == "input" && done.error == "error\n" ? EXIT_SUCCESS : EXIT_FAILURE;
}

int ignoreChildren(const Arguments&) {
  std::signal(SIGCHLD, SIG_IGN);
  const auto done = run("/bin/true", {});
  std::cout << done.error;
  return done.status;
}

} // namespace

std::optional<int> runAsHelper(int argc, char** argv) {
  static const std::map<std::string, int (*)(const Arguments&)> roles{{"descriptors", listDescriptors},
                                                                      {"signals", showSignals},
                                                                      {"echo-twice", echoTwice},
                                                                      {"emit", emit},
                                                                      {"die", die},
                                                                      {"close-standard", closeStandard},
                                                                      {"ignore-children", ignoreChildren}};
  const Arguments arguments(argv, argv + argc);
  if (arguments.size() < 3 || arguments[1] != "--helper") {
    return std::nullopt;
  }
  return roles.at(arguments[2])(Arguments(arguments.begin() + 3, arguments.end()));
}

ToolRun run(const std::string& executable, const std::vector<std::string>& arguments, const std::string& input) {
  ToolRun done{};
  done.status = backend::PosixToolRunner().run(executable, arguments, input, done.output, done.error);
  return done;
}

ToolRun runShell(const std::string& script, const std::string& input) {
  return run("/bin/sh", {"-c", script}, input);
}

ToolRun runHelper(std::vector<std::string> roleAndArguments, const std::string& input) {
  roleAndArguments.insert(roleAndArguments.begin(), "--helper");
  return run(std::filesystem::read_symlink("/proc/self/exe").string(), roleAndArguments, input);
}

} // namespace lumora::tests
