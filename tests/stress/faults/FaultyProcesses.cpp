// The functions by which the framework, and the libraries that it does it by, ask the system for processes, memory and
// random numbers.
#include "Interposing.h"

#include <array>
#include <csignal>
#include <cstdarg>
#include <cstddef>

#include <poll.h>
#include <spawn.h>
#include <sys/mman.h>
#include <sys/random.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

using namespace lumora::tests; // what follows must be in none

#pragma GCC visibility push(default)
extern "C" {

// The kernel's numbers are there at once, but for the first seconds of a machine.
ssize_t getrandom(void* buffer, std::size_t size, unsigned flags) {
  SYSTEMS_OWN(getrandom);
  MAY_FAIL(getrandom, -1, EINTR)
  return next(buffer, size, flags);
}

void* mmap(void* address, std::size_t size, int protection, int flags, int descriptor, off_t offset) noexcept {
  SYSTEMS_OWN(mmap);
  MAY_FAIL(mmap, MAP_FAILED, ENOMEM)
  return next(address, size, protection, flags, descriptor, offset);
}

int pipe2(int* ends, int flags) noexcept {
  SYSTEMS_OWN(pipe2);
  MAY_FAIL(pipe2, -1, EMFILE, ENFILE)
  return next(ends, flags);
}

int poll(struct pollfd* descriptors, nfds_t count, int timeout) {
  SYSTEMS_OWN(poll);
  MAY_FAIL(poll, -1, EINTR, ENOMEM)
  return next(descriptors, count, timeout);
}

// Tells its error by its result.
int posix_spawn(pid_t* process, const char* path, const posix_spawn_file_actions_t* actions,
                const posix_spawnattr_t* attributes, char* const* arguments, char* const* environment) {
  SYSTEMS_OWN(posix_spawn);
  const int fault = faultOf("posix_spawn", {EAGAIN, ENOMEM});
  return fault != none ? fault : next(process, path, actions, attributes, arguments, environment);
}

int posix_spawn_file_actions_adddup2(posix_spawn_file_actions_t* actions, int from, int to) noexcept {
  SYSTEMS_OWN(posix_spawn_file_actions_adddup2);
  const int fault = faultOf("posix_spawn_file_actions_adddup2", {ENOMEM});
  return fault != none ? fault : next(actions, from, to);
}

int posix_spawn_file_actions_addclosefrom_np(posix_spawn_file_actions_t* actions, int from) noexcept {
  SYSTEMS_OWN(posix_spawn_file_actions_addclosefrom_np);
  const int fault = faultOf("posix_spawn_file_actions_addclosefrom_np", {ENOMEM});
  return fault != none ? fault : next(actions, from);
}

// The child's end was taken by somebody else.
pid_t waitpid(pid_t process, int* status, int options) {
  SYSTEMS_OWN(waitpid);
  const int fault = faultOf("waitpid", {ECHILD, EINTR});
  if (fault == ECHILD) {
    next(process, nullptr, 0);
  }
  FAIL_IF(fault, -1)
  return next(process, status, options);
}

int sigtimedwait(const sigset_t* signals, siginfo_t* facts, const timespec* timeout) {
  SYSTEMS_OWN(sigtimedwait);
  MAY_FAIL(sigtimedwait, -1, EINTR)
  return next(signals, facts, timeout);
}

// The C library has no function of its own for the process descriptor that the framework asks for.
long syscall(long number, ...) noexcept {
  SYSTEMS_OWN(syscall);
  std::array<long, 6> values{};
  std::va_list arguments;
  va_start(arguments, number);
  for (long& value : values) {
    value = va_arg(arguments, long);
  }
  va_end(arguments);
  const int fault = number == SYS_pidfd_open ? faultOf("pidfd_open", {EMFILE, ENOMEM, ENOSYS}) : none;
  FAIL_IF(fault, -1L)
  return next(number, values[0], values[1], values[2], values[3], values[4], values[5]);
}

} // extern "C"
#pragma GCC visibility pop
