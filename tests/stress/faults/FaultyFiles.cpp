// The functions that the framework, and the libraries that it does it by, ask the system for files by.
#include "Interposing.h"

#include <cstdarg>
#include <cstddef>

#include <dirent.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

using namespace lumora::tests; // what follows must be in none

namespace {

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
  MAY_FAIL(fsync, -1, EIO, ENOSPC, EINTR)
  // Nothing of a try has to outlive the machine.
  return isFailing() ? 0 : next(descriptor);
}

int ftruncate(int descriptor, off_t length) noexcept {
  SYSTEMS_OWN(ftruncate);
  MAY_FAIL(ftruncate, -1, EIO, EINTR)
  return next(descriptor, length);
}

int rename(const char* from, const char* to) noexcept {
  SYSTEMS_OWN(rename);
  MAY_FAIL(rename, -1, EIO, ENOSPC, EACCES)
  return next(from, to);
}

int unlink(const char* path) noexcept {
  SYSTEMS_OWN(unlink);
  MAY_FAIL(unlink, -1, EIO, EACCES)
  return next(path);
}

int mkdir(const char* path, mode_t permissions) noexcept {
  SYSTEMS_OWN(mkdir);
  MAY_FAIL(mkdir, -1, EIO, ENOSPC, EACCES)
  return next(path, permissions);
}

int stat(const char* path, struct stat* facts) noexcept {
  SYSTEMS_OWN(stat);
  MAY_FAIL(stat, -1, EIO, ENOMEM, EACCES)
  return next(path, facts);
}

int fstat(int descriptor, struct stat* facts) noexcept {
  SYSTEMS_OWN(fstat);
  MAY_FAIL(fstat, -1, EIO, ENOMEM)
  return next(descriptor, facts);
}

// Libraries that can read large files call these two.
int stat64(const char* path, struct stat64* facts) noexcept {
  SYSTEMS_OWN(stat64);
  MAY_FAIL(stat64, -1, EIO, ENOMEM, EACCES)
  return next(path, facts);
}

int fstat64(int descriptor, struct stat64* facts) noexcept {
  SYSTEMS_OWN(fstat64);
  MAY_FAIL(fstat64, -1, EIO, ENOMEM)
  return next(descriptor, facts);
}

DIR* fdopendir(int descriptor) {
  SYSTEMS_OWN(fdopendir);
  MAY_FAIL(fdopendir, nullptr, ENOMEM)
  return next(descriptor);
}

struct dirent* readdir(DIR* folder) {
  SYSTEMS_OWN(readdir);
  MAY_FAIL(readdir, nullptr, EIO)
  return next(folder);
}

char* getcwd(char* buffer, std::size_t size) noexcept {
  SYSTEMS_OWN(getcwd);
  MAY_FAIL(getcwd, nullptr, ENOENT, ENOMEM)
  return next(buffer, size);
}

int flock(int descriptor, int operation) noexcept {
  SYSTEMS_OWN(flock);
  const int fault =
      (operation & LOCK_NB) != 0 ? faultOf("flock", {ENOLCK, EINTR, EWOULDBLOCK}) : faultOf("flock", {ENOLCK, EINTR});
  FAIL_IF(fault, -1)
  return next(descriptor, operation);
}

} // extern "C"
#pragma GCC visibility pop
