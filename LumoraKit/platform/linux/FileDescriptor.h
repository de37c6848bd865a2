#pragma once

#include <LumoraKit/platform/Export.h>

#include <utility>

namespace lumora::backend {

/// Owns one open file descriptor, or none (-1).
class LUMORA_INTERNAL FileDescriptor {
public:
  FileDescriptor() = default;
  explicit FileDescriptor(int descriptor) : descriptor_(descriptor) {}
  FileDescriptor(FileDescriptor&& other) noexcept : descriptor_(other.release()) {}
  FileDescriptor& operator=(FileDescriptor&& other) noexcept;
  ~FileDescriptor() { close(); }

  int get() const { return descriptor_; }
  bool isOpen() const { return descriptor_ >= 0; }
  /// Gives up the ownership.
  int release() { return std::exchange(descriptor_, -1); }
  /// Closes now; does nothing when nothing is open. Leaves errno as it was.
  void close();

private:
  int descriptor_ = -1;
};

/// The two ends of a pipe, closed on exec, both above the standard descriptors also in a process that closed those:
/// a child can dup2 them onto 0, 1 and 2 without one overwriting another.
struct LUMORA_INTERNAL Pipe {
  FileDescriptor readEnd;
  FileDescriptor writeEnd;

  /// Opens both ends. 0, or errno.
  int open();
};

} // namespace lumora::backend
