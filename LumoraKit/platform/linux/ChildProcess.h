#pragma once

#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <string>
#include <vector>

#include <sys/types.h>

namespace lumora::backend {

/// What a child gets as its descriptors 0, 1 and 2; it gets no others.
struct ChildDescriptors {
  int standardInput;
  int standardOutput;
  int standardError;
};

/// One child process, from its start to its end. The child begins with no signal blocked and every signal at its
/// default, whatever this process has set.
class LUMORA_INTERNAL ChildProcess {
public:
  ChildProcess() = default;
  ChildProcess(const ChildProcess&) = delete;
  ChildProcess& operator=(const ChildProcess&) = delete;

  /// Starts the executable with its path as its name. 0, or the errno that says why it could not be started.
  int start(const std::string& executable, const std::vector<std::string>& arguments,
            const ChildDescriptors& descriptors);

  /// Readable once the child has ended; not open when the system had none to give, and then tryReap() must be asked
  /// from time to time.
  const FileDescriptor& endDescriptor() const { return endDescriptor_; }

  /// Takes the ended child off the process table. False while it is still running.
  bool tryReap();

  /// After the end: the exit status, 128+n after death by signal n, or -1 when somebody else in this process took the
  /// child's status away (a SIGCHLD that is ignored does so as well).
  int status() const { return status_; }

private:
  pid_t process_ = -1;
  FileDescriptor endDescriptor_;
  int status_ = -1;
};

} // namespace lumora::backend
