#include <LumoraKit/platform/linux/ChildProcess.h>

#include <cerrno>
#include <csignal>

#include <spawn.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr int firstDescriptorToClose = 3;
constexpr int signalStatusBase = 128;

class FileActions {
public:
  explicit FileActions(const ChildDescriptors& descriptors) {
    posix_spawn_file_actions_init(&actions_);
    note(posix_spawn_file_actions_adddup2(&actions_, descriptors.standardInput, STDIN_FILENO));
    note(posix_spawn_file_actions_adddup2(&actions_, descriptors.standardOutput, STDOUT_FILENO));
    note(posix_spawn_file_actions_adddup2(&actions_, descriptors.standardError, STDERR_FILENO));
    // Also what other code of this process opened without close-on-exec.
    note(posix_spawn_file_actions_addclosefrom_np(&actions_, firstDescriptorToClose));
  }
  FileActions(const FileActions&) = delete;
  FileActions& operator=(const FileActions&) = delete;
  ~FileActions() { posix_spawn_file_actions_destroy(&actions_); }

  const posix_spawn_file_actions_t* get() const { return &actions_; }
  // 0, or why they are not complete: a child must not be started with descriptors of this process.
  int error() const { return error_; }

private:
  void note(int error) { error_ = error_ != 0 ? error_ : error; }

  posix_spawn_file_actions_t actions_{};
  int error_ = 0;
};

class SpawnAttributes {
public:
  SpawnAttributes() {
    sigset_t none;
    sigset_t all;
    sigemptyset(&none);
    sigfillset(&all);
    posix_spawnattr_init(&attributes_);
    posix_spawnattr_setsigmask(&attributes_, &none);
    posix_spawnattr_setsigdefault(&attributes_, &all);
    posix_spawnattr_setflags(&attributes_, POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF);
  }
  SpawnAttributes(const SpawnAttributes&) = delete;
  SpawnAttributes& operator=(const SpawnAttributes&) = delete;
  ~SpawnAttributes() { posix_spawnattr_destroy(&attributes_); }

  const posix_spawnattr_t* get() const { return &attributes_; }

private:
  posix_spawnattr_t attributes_{};
};

// posix_spawn takes the strings as char* and leaves them alone.
std::vector<char*> argumentVector(const std::string& executable, const std::vector<std::string>& arguments) {
  std::vector<char*> vector;
  vector.reserve(arguments.size() + 2);
  vector.push_back(const_cast<char*>(executable.c_str()));
  for (const std::string& argument : arguments) {
    vector.push_back(const_cast<char*>(argument.c_str()));
  }
  vector.push_back(nullptr);
  return vector;
}

int decoded(int waitStatus) {
  return WIFSIGNALED(waitStatus) ? signalStatusBase + WTERMSIG(waitStatus) : WEXITSTATUS(waitStatus);
}

} // namespace

int ChildProcess::start(const std::string& executable, const std::vector<std::string>& arguments,
                        const ChildDescriptors& descriptors) {
  const FileActions actions(descriptors);
  if (actions.error() != 0) {
    return actions.error();
  }
  const SpawnAttributes attributes;
  const auto vector = argumentVector(executable, arguments);
  const int error = posix_spawn(&process_, executable.c_str(), actions.get(), attributes.get(), vector.data(), environ);
  if (error == 0) {
    endDescriptor_ = FileDescriptor(static_cast<int>(syscall(SYS_pidfd_open, process_, 0)));
  }
  return error;
}

bool ChildProcess::tryReap() {
  int waitStatus = 0;
  pid_t reaped = 0;
  do {
    reaped = waitpid(process_, &waitStatus, WNOHANG);
  } while (reaped < 0 && errno == EINTR);
  if (reaped == process_) {
    status_ = decoded(waitStatus);
  }
  return reaped != 0;
}

} // namespace lumora::backend
