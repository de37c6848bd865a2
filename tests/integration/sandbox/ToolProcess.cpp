#include "ToolProcess.h"

#include <csignal>
#include <stdexcept>

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::tests {

ToolProcess::ToolProcess(const std::filesystem::path& tool, const std::filesystem::path& input) {
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, input.c_str(), O_RDONLY, 0);
  for (const int output : {STDOUT_FILENO, STDERR_FILENO}) {
    posix_spawn_file_actions_addopen(&actions, output, "/dev/null", O_WRONLY, 0);
  }
  std::string path = tool.string();
  std::string flag = "--plistin";
  char* const arguments[] = {path.data(), flag.data(), nullptr};
  const int error = posix_spawn(&process_, path.c_str(), &actions, nullptr, arguments, environ);
  posix_spawn_file_actions_destroy(&actions);
  if (error != 0) {
    throw std::runtime_error(path + " could not be started");
  }
}

ToolProcess::~ToolProcess() {
  kill();
}

bool ToolProcess::isRunning() {
  if (process_ > 0 && waitpid(process_, nullptr, WNOHANG) == process_) {
    process_ = -1;
  }
  return process_ > 0;
}

void ToolProcess::kill() {
  if (isRunning()) {
    ::kill(process_, SIGKILL);
    waitpid(process_, nullptr, 0);
    process_ = -1;
  }
}

} // namespace lumora::tests
