// The private memory of an idle application that has the framework loaded, against programs without it.

#include "support/Figures.h"

#include <array>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::bench {
namespace {

/// A program of LUMORA_PROGRAMS that is ready and waits.
class IdleProgram {
public:
  explicit IdleProgram(const std::string& name) {
    std::array<int, 2> input{};
    std::array<int, 2> output{};
    if (pipe2(input.data(), O_CLOEXEC) != 0 || pipe2(output.data(), O_CLOEXEC) != 0) {
      std::abort();
    }
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, input[0], STDIN_FILENO);
    posix_spawn_file_actions_adddup2(&actions, output[1], STDOUT_FILENO);
    std::string path = LUMORA_PROGRAMS;
    path.append("/idle-memory-").append(name);
    const std::array<char*, 2> arguments{path.data(), nullptr};
    if (posix_spawn(&process_, path.c_str(), &actions, nullptr, arguments.data(), environ) != 0) {
      std::abort();
    }
    posix_spawn_file_actions_destroy(&actions);
    close(input[0]);
    close(output[1]);
    input_ = input[1];
    char ready = 0;
    if (read(output[0], &ready, 1) != 1) {
      std::abort();
    }
    close(output[0]);
  }
  IdleProgram(const IdleProgram&) = delete;
  IdleProgram& operator=(const IdleProgram&) = delete;
  ~IdleProgram() {
    close(input_);
    waitpid(process_, nullptr, 0);
  }

  /// What it alone has, in MiB (of /proc/PID/smaps_rollup, which tells KiB).
  double privateMemory() const {
    std::ifstream lines("/proc/" + std::to_string(process_) + "/smaps_rollup");
    double kibibytes = 0;
    for (std::string word; lines >> word;) {
      double value = 0;
      if (word.starts_with("Private_") && !word.starts_with("Private_Hugetlb") && lines >> value) {
        kibibytes += value;
      }
    }
    return kibibytes / 1024;
  }

private:
  pid_t process_ = -1;
  int input_ = -1;
};

} // namespace
} // namespace lumora::bench

int main() {
  using lumora::bench::IdleProgram;
  using lumora::bench::tell;
  // Two of each: what they share counts for neither.
  const IdleProgram empty("empty");
  const IdleProgram otherEmpty("empty");
  const IdleProgram media("media-libraries");
  const IdleProgram otherMedia("media-libraries");
  const IdleProgram framework("framework");
  const IdleProgram otherFramework("framework");
  tell("private memory of a C++ program that does nothing", empty.privateMemory(), "MiB");
  tell("private memory of a program that has started GStreamer", media.privateMemory(), "MiB");
  tell("private memory of an application that has listed its devices", framework.privateMemory(), "MiB");
  return EXIT_SUCCESS;
}
