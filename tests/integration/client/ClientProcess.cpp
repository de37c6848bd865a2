#include "ClientProcess.h"

#include <array>
#include <csignal>
#include <cstdlib>
#include <stdexcept>

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>

namespace lumora::tests {

namespace {

class SpawnAttributes {
public:
  SpawnAttributes() {
    sigset_t none;
    sigset_t all;
    sigemptyset(&none);
    sigfillset(&all);
    posix_spawnattr_init(&attributes_);
    // Whoever runs the tests may have ignored a signal.
    posix_spawnattr_setsigdefault(&attributes_, &all);
    posix_spawnattr_setsigmask(&attributes_, &none);
    posix_spawnattr_setflags(&attributes_, POSIX_SPAWN_SETSID | POSIX_SPAWN_SETSIGDEF | POSIX_SPAWN_SETSIGMASK);
  }
  SpawnAttributes(const SpawnAttributes&) = delete;
  SpawnAttributes& operator=(const SpawnAttributes&) = delete;
  ~SpawnAttributes() { posix_spawnattr_destroy(&attributes_); }
  const posix_spawnattr_t* get() const { return &attributes_; }

private:
  posix_spawnattr_t attributes_{};
};

pid_t spawn(const std::vector<std::string>& commandLine, const posix_spawn_file_actions_t& actions) {
  std::vector<char*> arguments;
  arguments.reserve(commandLine.size() + 1);
  for (const auto& argument : commandLine) {
    arguments.push_back(const_cast<char*>(argument.c_str()));
  }
  arguments.push_back(nullptr);
  pid_t process = -1;
  const SpawnAttributes attributes;
  if (posix_spawnp(&process, arguments[0], &actions, attributes.get(), arguments.data(), environ) != 0) {
    throw std::runtime_error(commandLine.front() + " could not be started");
  }
  return process;
}

} // namespace

ClientProcess::ClientProcess(const std::vector<std::string>& commandLine, Terminal terminal, std::string_view input) {
  writeFile(folder_ / "input", input);
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  const auto open = [&](int descriptor, const std::string& path, int flags) {
    posix_spawn_file_actions_addopen(&actions, descriptor, path.c_str(), flags, 0600);
  };
  const int create = O_WRONLY | O_CREAT | O_APPEND;
  if (terminal == Terminal::None) {
    open(STDIN_FILENO, (folder_ / "input").string(), O_RDONLY);
    open(STDERR_FILENO, (folder_ / "error").string(), create);
  } else {
    terminal_ = openTerminal();
    // The first terminal that the leader of a session opens becomes the session's.
    open(STDIN_FILENO, ptsname(terminal_), O_RDWR);
    posix_spawn_file_actions_adddup2(&actions, STDIN_FILENO, STDERR_FILENO);
  }
  if (terminal == Terminal::Everywhere) {
    posix_spawn_file_actions_adddup2(&actions, STDIN_FILENO, STDOUT_FILENO);
  } else {
    open(STDOUT_FILENO, (folder_ / "output").string(), create);
  }
  process_ = spawn(commandLine, actions);
  posix_spawn_file_actions_destroy(&actions);
}

ClientProcess::~ClientProcess() {
  if (process_ > 0) {
    kill(process_, SIGKILL);
    wait();
  }
  if (terminal_ >= 0) {
    close(terminal_);
  }
}

int ClientProcess::openTerminal() {
  const int terminal = posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
  if (terminal < 0 || grantpt(terminal) != 0 || unlockpt(terminal) != 0) {
    throw std::runtime_error("there is no terminal to be had");
  }
  return terminal;
}

void ClientProcess::signal(int number) const {
  kill(process_, number);
}

int ClientProcess::wait() {
  int status = 0;
  waitpid(process_, &status, 0);
  process_ = -1;
  return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

std::string ClientProcess::readUntil(std::string_view text) {
  constexpr int patience = 60000; // milliseconds
  std::string all;
  while (all.find(text) == std::string::npos) {
    pollfd polled{terminal_, POLLIN, 0};
    std::array<char, 4096> part{};
    if (poll(&polled, 1, patience) <= 0) {
      break;
    }
    const ssize_t count = read(terminal_, part.data(), part.size());
    if (count <= 0) {
      break;
    }
    all.append(part.data(), static_cast<std::size_t>(count));
  }
  return all;
}

void ClientProcess::type(std::string_view text) const {
  if (write(terminal_, text.data(), text.size()) != static_cast<ssize_t>(text.size())) {
    throw std::runtime_error("the terminal takes no input");
  }
}

bool ClientProcess::echoes() const {
  termios attributes{};
  tcgetattr(terminal_, &attributes);
  return (attributes.c_lflag & ECHO) != 0;
}

ProgramRun runToEnd(const std::vector<std::string>& commandLine, std::string_view input) {
  ClientProcess process(commandLine, ClientProcess::Terminal::None, input);
  ProgramRun run;
  run.status = process.wait();
  run.standardOutput = process.standardOutput();
  run.standardError = process.standardError();
  return run;
}

} // namespace lumora::tests
