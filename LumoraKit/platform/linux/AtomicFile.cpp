#include <LumoraKit/platform/linux/AtomicFile.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <system_error>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

// A new file beside its final place, removed again unless it was moved there. Its functions give 0 or errno.
class TemporaryFile {
public:
  explicit TemporaryFile(const std::filesystem::path& folder) : name_((folder / ".lumora-XXXXXX").string()) {}
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;
  ~TemporaryFile() {
    if (exists_) {
      unlink(name_.c_str());
    }
  }

  int create() {
    file_ = FileDescriptor(mkostemp(name_.data(), O_CLOEXEC));
    exists_ = file_.isOpen();
    return exists_ ? 0 : errno;
  }

  int write(std::string_view content) {
    while (!content.empty()) {
      const ssize_t written = ::write(file_.get(), content.data(), content.size());
      if (written >= 0) {
        content.remove_prefix(static_cast<std::size_t>(written));
      } else if (errno != EINTR) {
        return errno;
      }
    }
    return fsync(file_.get()) == 0 ? 0 : errno;
  }

  int moveTo(const std::filesystem::path& path) {
    if (std::rename(name_.c_str(), path.c_str()) != 0) {
      return errno;
    }
    exists_ = false;
    return 0;
  }

private:
  std::string name_;
  FileDescriptor file_;
  bool exists_ = false;
};

// The new file is in place already: when the folder cannot be flushed (some file systems refuse that), only a crash
// within the next seconds could still bring the old one back.
void flushDirectory(const std::filesystem::path& folder) {
  const FileDescriptor directory(open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (directory.isOpen()) {
    fsync(directory.get());
  }
}

} // namespace

LMRErrorRef replaceFile(const std::filesystem::path& path, std::string_view content) {
  const auto folder = path.has_parent_path() ? path.parent_path() : std::filesystem::path(".");
  TemporaryFile file(folder);
  int error = file.create();
  if (error == 0) {
    error = file.write(content);
  }
  if (error == 0) {
    error = file.moveTo(path);
  }
  if (error != 0) {
    return LMRError::fromErrno(error, path.string());
  }
  flushDirectory(folder);
  return nullptr;
}

std::optional<std::string> contentOfFile(const std::filesystem::path& path) {
  const FileDescriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
  std::string content;
  std::array<char, std::size_t{16} * 1024> buffer{};
  while (file.isOpen()) {
    const ssize_t count = read(file.get(), buffer.data(), buffer.size());
    if (count == 0) {
      return content;
    }
    if (count > 0) {
      content.append(buffer.data(), static_cast<std::size_t>(count));
    } else if (errno != EINTR) {
      break;
    }
  }
  return std::nullopt;
}

std::optional<std::string> partOfFile(const std::filesystem::path& path, std::uint64_t offset, std::size_t length) {
  const FileDescriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
  std::string part(file.isOpen() ? length : 0, '\0');
  std::size_t filled = 0;
  while (file.isOpen()) {
    const auto place = static_cast<off_t>(offset + filled);
    const ssize_t count = pread(file.get(), part.data() + filled, part.size() - filled, place);
    if (count == 0) {
      part.resize(filled);
      return part;
    }
    if (count > 0) {
      filled += static_cast<std::size_t>(count);
    } else if (errno != EINTR) {
      break;
    }
  }
  return std::nullopt;
}

LMRErrorRef truncateFile(const std::filesystem::path& path, std::uint64_t length) {
  const FileDescriptor file(open(path.c_str(), O_WRONLY | O_CLOEXEC));
  struct stat facts {};
  bool succeeded = file.isOpen() && fstat(file.get(), &facts) == 0;
  if (succeeded && length > static_cast<std::uint64_t>(facts.st_size)) {
    errno = EINVAL;
    succeeded = false;
  }
  succeeded = succeeded && ftruncate(file.get(), static_cast<off_t>(length)) == 0 && fsync(file.get()) == 0;
  return succeeded ? nullptr : LMRError::fromErrno(errno, path.string());
}

LMRErrorRef makeDirectories(const std::filesystem::path& path, mode_t permissions) {
  std::filesystem::path current;
  for (const auto& part : path) {
    current /= part;
    if (isExistingDirectory(current) || mkdir(current.c_str(), permissions) == 0) {
      continue;
    }
    const int error = errno;
    // Another process may have made it in between.
    if (!isExistingDirectory(current)) {
      return LMRError::fromErrno(error, path.string());
    }
  }
  return nullptr;
}

bool isExistingDirectory(const std::filesystem::path& path) {
  std::error_code ignored;
  return std::filesystem::is_directory(path, ignored);
}

} // namespace lumora::backend
