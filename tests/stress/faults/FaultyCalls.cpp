#include "FaultyCalls.h"

#include <array>
#include <cerrno>
#include <cstdarg>
#include <initializer_list>
#include <string_view>
#include <system_error>

#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/file.h>
#include <sys/mman.h>
#include <sys/random.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::tests {

namespace {

constexpr int onlyAPart = 0;
constexpr int none = -1;

std::atomic<Fault*> current = nullptr;
std::atomic<std::size_t> calls = 0;

// The error that this call is to fail with, or onlyAPart; none when it is to succeed.
int faultOf(const char* function, std::initializer_list<int> ways) {
  Fault* const fault = current;
  if (!fault) {
    return none;
  }
  fault->noteCalled(function);
  if (std::string_view(fault->function) != function || ++calls != fault->call) {
    return none;
  }
  fault->ways = ways.size();
  const int error = ways.begin()[fault->way % ways.size()];
  fault->error = error;
  fault->happened = true;
  return error;
}

// The function of this name that this program hides. Looked up without a lock and made without code: the sanitizers
// call some before they know of locks.
class SystemsOwn {
public:
  constexpr explicit SystemsOwn(const char* name) : name_(name) {}

  // Of the type of the one that hides it.
  template <class Function> Function* like(Function* /*hiding*/) {
    void* found = found_;
    if (!found) {
      found = dlsym(RTLD_NEXT, name_);
      found_ = found;
    }
    return reinterpret_cast<Function*>(found);
  }

private:
  const char* const name_;
  std::atomic<void*> found_ = nullptr;
};

template <class Result> Result failWith(int error, Result result) {
  errno = error;
  return result;
}

bool isFailing() {
  return current.load() != nullptr;
}

std::size_t partOf(std::size_t size) {
  return size > 1 ? size / 2 : size;
}

bool isPipe(int descriptor) {
  static constinit SystemsOwn own("fstat");
  struct stat facts {};
  return own.like(&::fstat)(descriptor, &facts) == 0 && S_ISFIFO(facts.st_mode);
}

int faultOfOpening(const char* function, int flags) {
  return (flags & O_CREAT) != 0 ? faultOf(function, {EMFILE, EIO, EACCES, ENOSPC, EINTR})
                                : faultOf(function, {EMFILE, EIO, EACCES, EINTR});
}

int faultOfReading(const char* function) {
  return faultOf(function, {EIO, EINTR, onlyAPart});
}

int faultOfWriting(int descriptor) {
  return isPipe(descriptor) ? faultOf("write", {ENOMEM, EAGAIN, EINTR, onlyAPart})
                            : faultOf("write", {EIO, ENOSPC, EDQUOT, EINTR, onlyAPart});
}

} // namespace

std::string Fault::description() const {
  const std::string what = error == onlyAPart ? "only a part" : std::generic_category().message(error);
  return call == 0 ? "no call failed" : std::string(function) + ", call " + std::to_string(call) + ": " + what;
}

std::vector<const char*> Fault::called() const {
  std::vector<const char*> names;
  for (std::size_t i = 0; i < called_.size() && called_[i]; ++i) {
    names.push_back(called_[i]);
  }
  return names;
}

void Fault::noteCalled(const char* name) {
  for (auto& place : called_) {
    const char* expected = nullptr;
    if (place.compare_exchange_strong(expected, name) || std::string_view(expected) == name) {
      return;
    }
  }
}

void letFail(Fault& fault) {
  calls = 0;
  current = &fault;
}

void letSucceed() {
  current = nullptr;
}

WithoutFaults::WithoutFaults() : paused_(current.exchange(nullptr)) {}

WithoutFaults::~WithoutFaults() {
  current = paused_;
}

} // namespace lumora::tests

// The functions that the framework, and the libraries that it does it by, ask the system by. A library's call of one of
// these names arrives here, because the program comes before the C library.

using namespace lumora::tests; // what follows must be in none

#define SYSTEMS_OWN(function)                                                                                          \
  static constinit SystemsOwn own(#function);                                                                          \
  const auto next = own.like(&::function)

// What succeeds although it was to fail would never be noticed: a failed call does nothing.
#define FAIL_IF(fault, result)                                                                                         \
  if ((fault) != none) {                                                                                               \
    return failWith(fault, result);                                                                                    \
  }

#pragma GCC visibility push(default)
extern "C" {

int open(const char* path, int flags, ...) {
  SYSTEMS_OWN(open);
  std::va_list arguments;
  va_start(arguments, flags);
  const auto permissions = (flags & O_CREAT) != 0 ? va_arg(arguments, mode_t) : mode_t{0};
  va_end(arguments);
  const int fault = faultOfOpening("open", flags);
  FAIL_IF(fault, -1)
  return next(path, flags, permissions);
}

int openat(int folder, const char* path, int flags, ...) {
  SYSTEMS_OWN(openat);
  std::va_list arguments;
  va_start(arguments, flags);
  const auto permissions = (flags & O_CREAT) != 0 ? va_arg(arguments, mode_t) : mode_t{0};
  va_end(arguments);
  const int fault = faultOfOpening("openat", flags);
  FAIL_IF(fault, -1)
  return next(folder, path, flags, permissions);
}

int mkostemp(char* name, int flags) {
  SYSTEMS_OWN(mkostemp);
  const int fault = faultOfOpening("mkostemp", flags | O_CREAT);
  FAIL_IF(fault, -1)
  return next(name, flags);
}

// The descriptor is closed in any case, as Linux does it.
int close(int descriptor) {
  SYSTEMS_OWN(close);
  const int fault = faultOf("close", {EIO, EINTR, ENOSPC});
  const int result = next(descriptor);
  FAIL_IF(fault, -1)
  return result;
}

ssize_t read(int descriptor, void* buffer, std::size_t size) {
  SYSTEMS_OWN(read);
  const int fault = faultOfReading("read");
  if (fault == onlyAPart) {
    return next(descriptor, buffer, partOf(size));
  }
  FAIL_IF(fault, -1)
  return next(descriptor, buffer, size);
}

ssize_t pread(int descriptor, void* buffer, std::size_t size, off_t offset) {
  SYSTEMS_OWN(pread);
  const int fault = faultOfReading("pread");
  if (fault == onlyAPart) {
    return next(descriptor, buffer, partOf(size), offset);
  }
  FAIL_IF(fault, -1)
  return next(descriptor, buffer, size, offset);
}

ssize_t write(int descriptor, const void* data, std::size_t size) {
  SYSTEMS_OWN(write);
  const int fault = faultOfWriting(descriptor);
  if (fault == onlyAPart) {
    return next(descriptor, data, partOf(size));
  }
  FAIL_IF(fault, -1)
  return next(descriptor, data, size);
}

int fsync(int descriptor) {
  SYSTEMS_OWN(fsync);
  const int fault = faultOf("fsync", {EIO, ENOSPC, EINTR});
  FAIL_IF(fault, -1)
  // Nothing of a try has to outlive the machine.
  return isFailing() ? 0 : next(descriptor);
}

int ftruncate(int descriptor, off_t length) noexcept {
  SYSTEMS_OWN(ftruncate);
  const int fault = faultOf("ftruncate", {EIO, EINTR});
  FAIL_IF(fault, -1)
  return next(descriptor, length);
}

int rename(const char* from, const char* to) noexcept {
  SYSTEMS_OWN(rename);
  const int fault = faultOf("rename", {EIO, ENOSPC, EACCES});
  FAIL_IF(fault, -1)
  return next(from, to);
}

int unlink(const char* path) noexcept {
  SYSTEMS_OWN(unlink);
  const int fault = faultOf("unlink", {EIO, EACCES});
  FAIL_IF(fault, -1)
  return next(path);
}

int mkdir(const char* path, mode_t permissions) noexcept {
  SYSTEMS_OWN(mkdir);
  const int fault = faultOf("mkdir", {EIO, ENOSPC, EACCES});
  FAIL_IF(fault, -1)
  return next(path, permissions);
}

int stat(const char* path, struct stat* facts) noexcept {
  SYSTEMS_OWN(stat);
  const int fault = faultOf("stat", {EIO, ENOMEM, EACCES});
  FAIL_IF(fault, -1)
  return next(path, facts);
}

int fstat(int descriptor, struct stat* facts) noexcept {
  SYSTEMS_OWN(fstat);
  const int fault = faultOf("fstat", {EIO, ENOMEM});
  FAIL_IF(fault, -1)
  return next(descriptor, facts);
}

// Libraries that can read large files call these two.
int stat64(const char* path, struct stat64* facts) noexcept {
  SYSTEMS_OWN(stat64);
  const int fault = faultOf("stat64", {EIO, ENOMEM, EACCES});
  FAIL_IF(fault, -1)
  return next(path, facts);
}

int fstat64(int descriptor, struct stat64* facts) noexcept {
  SYSTEMS_OWN(fstat64);
  const int fault = faultOf("fstat64", {EIO, ENOMEM});
  FAIL_IF(fault, -1)
  return next(descriptor, facts);
}

DIR* fdopendir(int descriptor) {
  SYSTEMS_OWN(fdopendir);
  const int fault = faultOf("fdopendir", {ENOMEM});
  FAIL_IF(fault, nullptr)
  return next(descriptor);
}

struct dirent* readdir(DIR* folder) {
  SYSTEMS_OWN(readdir);
  const int fault = faultOf("readdir", {EIO});
  FAIL_IF(fault, nullptr)
  return next(folder);
}

char* getcwd(char* buffer, std::size_t size) noexcept {
  SYSTEMS_OWN(getcwd);
  const int fault = faultOf("getcwd", {ENOENT, ENOMEM});
  FAIL_IF(fault, nullptr)
  return next(buffer, size);
}

int flock(int descriptor, int operation) noexcept {
  SYSTEMS_OWN(flock);
  const int fault =
      (operation & LOCK_NB) != 0 ? faultOf("flock", {ENOLCK, EINTR, EWOULDBLOCK}) : faultOf("flock", {ENOLCK, EINTR});
  FAIL_IF(fault, -1)
  return next(descriptor, operation);
}

// The kernel's numbers are there at once, but for the first seconds of a machine.
ssize_t getrandom(void* buffer, std::size_t size, unsigned flags) {
  SYSTEMS_OWN(getrandom);
  const int fault = faultOf("getrandom", {EINTR});
  FAIL_IF(fault, -1)
  return next(buffer, size, flags);
}

void* mmap(void* address, std::size_t size, int protection, int flags, int descriptor, off_t offset) noexcept {
  SYSTEMS_OWN(mmap);
  const int fault = faultOf("mmap", {ENOMEM});
  FAIL_IF(fault, MAP_FAILED)
  return next(address, size, protection, flags, descriptor, offset);
}

int pipe2(int* ends, int flags) noexcept {
  SYSTEMS_OWN(pipe2);
  const int fault = faultOf("pipe2", {EMFILE, ENFILE});
  FAIL_IF(fault, -1)
  return next(ends, flags);
}

int poll(struct pollfd* descriptors, nfds_t count, int timeout) {
  SYSTEMS_OWN(poll);
  const int fault = faultOf("poll", {EINTR, ENOMEM});
  FAIL_IF(fault, -1)
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
  const int fault = faultOf("sigtimedwait", {EINTR});
  FAIL_IF(fault, -1)
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
