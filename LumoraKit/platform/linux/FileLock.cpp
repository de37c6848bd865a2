#include <LumoraKit/platform/linux/FileLock.h>

#include <cerrno>
#include <string>
#include <thread>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>

namespace lumora::backend {
namespace {

constexpr mode_t permissions = 0600;
// There is no call that waits for a lock and for a deadline.
constexpr std::chrono::milliseconds pause{5};

int waitForTurn(const FileDescriptor& file, std::optional<FileLock::Time> deadline) {
  while (flock(file.get(), deadline ? LOCK_EX | LOCK_NB : LOCK_EX) != 0) {
    if (errno == EWOULDBLOCK) {
      if (std::chrono::steady_clock::now() >= *deadline) {
        return ETIMEDOUT;
      }
      std::this_thread::sleep_for(pause);
    } else if (errno != EINTR) {
      return errno;
    }
  }
  return 0;
}

} // namespace

LMRErrorRef FileLock::take(const std::filesystem::path& path, std::optional<Time> deadline) {
  file_ = FileDescriptor(open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, permissions));
  const int error = file_.isOpen() ? waitForTurn(file_, deadline) : errno;
  return error == 0 ? nullptr : LMRError::fromErrno(error, path.string());
}

} // namespace lumora::backend
