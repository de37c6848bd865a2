#include "BareRun.h"

#include <array>
#include <cstdlib>

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::bench {
namespace {

struct BarePipe {
  BarePipe() {
    if (pipe2(ends.data(), O_CLOEXEC) != 0) {
      std::abort();
    }
  }

  int readEnd() const { return ends[0]; }
  int writeEnd() const { return ends[1]; }

  std::array<int, 2> ends{};
};

void collect(int output, int error, std::string& outputText, std::string& errorText) {
  std::array<char, 64 * 1024> buffer; // NOLINT(cppcoreguidelines-pro-type-member-init): filled by read
  std::array<pollfd, 2> polled{{{output, POLLIN, 0}, {error, POLLIN, 0}}};
  const std::array<std::string*, 2> texts{&outputText, &errorText};
  while (polled[0].fd >= 0 || polled[1].fd >= 0) {
    poll(polled.data(), polled.size(), -1);
    for (std::size_t i = 0; i < polled.size(); ++i) {
      if (polled[i].fd < 0 || polled[i].revents == 0) {
        continue;
      }
      const ssize_t count = read(polled[i].fd, buffer.data(), buffer.size());
      if (count > 0) {
        texts[i]->append(buffer.data(), static_cast<std::size_t>(count));
      } else {
        close(polled[i].fd);
        polled[i].fd = -1;
      }
    }
  }
}

} // namespace

void bareRun(const std::string& executable, const std::vector<std::string>& arguments, const std::string& standardInput,
             std::string& standardOutput, std::string& standardError) {
  const BarePipe input;
  const BarePipe output;
  const BarePipe error;
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, input.readEnd(), STDIN_FILENO);
  posix_spawn_file_actions_adddup2(&actions, output.writeEnd(), STDOUT_FILENO);
  posix_spawn_file_actions_adddup2(&actions, error.writeEnd(), STDERR_FILENO);
  std::vector<char*> vector{const_cast<char*>(executable.c_str())};
  for (const std::string& argument : arguments) {
    vector.push_back(const_cast<char*>(argument.c_str()));
  }
  vector.push_back(nullptr);
  pid_t child = -1;
  if (posix_spawn(&child, executable.c_str(), &actions, nullptr, vector.data(), environ) != 0) {
    std::abort();
  }
  posix_spawn_file_actions_destroy(&actions);
  close(output.writeEnd());
  close(error.writeEnd());
  // Short enough for the pipe, and the read end is still open here: no waiting, no signal.
  if (write(input.writeEnd(), standardInput.data(), standardInput.size()) < 0) {
    std::abort();
  }
  close(input.writeEnd());
  close(input.readEnd());
  collect(output.readEnd(), error.readEnd(), standardOutput, standardError);
  waitpid(child, nullptr, 0);
}

} // namespace lumora::bench
