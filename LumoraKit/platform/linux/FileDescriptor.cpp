#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <array>
#include <cerrno>

#include <fcntl.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr int firstOrdinaryDescriptor = 3;

int moveAboveStandardDescriptors(FileDescriptor& descriptor) {
  if (descriptor.get() >= firstOrdinaryDescriptor) {
    return 0;
  }
  FileDescriptor moved(fcntl(descriptor.get(), F_DUPFD_CLOEXEC, firstOrdinaryDescriptor));
  if (!moved.isOpen()) {
    return errno;
  }
  descriptor = std::move(moved);
  return 0;
}

} // namespace

FileDescriptor& FileDescriptor::operator=(FileDescriptor&& other) noexcept {
  if (this != &other) {
    close();
    descriptor_ = other.release();
  }
  return *this;
}

void FileDescriptor::close() {
  if (isOpen()) {
    const int savedError = errno;
    ::close(release());
    errno = savedError;
  }
}

int Pipe::open() {
  std::array<int, 2> ends{};
  if (pipe2(ends.data(), O_CLOEXEC) != 0) {
    return errno;
  }
  readEnd = FileDescriptor(ends[0]);
  writeEnd = FileDescriptor(ends[1]);
  const int error = moveAboveStandardDescriptors(readEnd);
  return error != 0 ? error : moveAboveStandardDescriptors(writeEnd);
}

} // namespace lumora::backend
