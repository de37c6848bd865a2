#include "FileCopy.h"

#include "../Status.h"

#include <sodium.h>

#include <array>
#include <cerrno>
#include <cstring>
#include <vector>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace lumora::sandbox {

namespace {

[[noreturn]] void refuse(const std::filesystem::path& path, const std::string& what) {
  throw Refusal(Status::FileCopyFailed, path.string() + ": " + what);
}

[[noreturn]] void refuseWithErrno(const std::filesystem::path& path) {
  refuse(path, std::strerror(errno));
}

class Descriptor {
public:
  Descriptor(const std::filesystem::path& path, int flags) : path_(path), number_(open(path.c_str(), flags, 0600)) {
    if (number_ < 0) {
      refuseWithErrno(path);
    }
  }
  Descriptor(const Descriptor&) = delete;
  Descriptor& operator=(const Descriptor&) = delete;
  ~Descriptor() { close(number_); }

  void requireRegularFile() const {
    struct stat status {};
    if (fstat(number_, &status) != 0) {
      refuseWithErrno(path_);
    }
    if (!S_ISREG(status.st_mode)) {
      refuse(path_, "not a regular file");
    }
  }

  std::size_t readSome(std::vector<unsigned char>& buffer) const {
    for (;;) {
      const ssize_t count = read(number_, buffer.data(), buffer.size());
      if (count >= 0) {
        return static_cast<std::size_t>(count);
      }
      if (errno != EINTR) {
        refuseWithErrno(path_);
      }
    }
  }

  void writeAll(const unsigned char* bytes, std::size_t size) const {
    while (size > 0) {
      const ssize_t count = write(number_, bytes, size);
      if (count >= 0) {
        bytes += count;
        size -= static_cast<std::size_t>(count);
      } else if (errno != EINTR) {
        refuseWithErrno(path_);
      }
    }
  }

private:
  const std::filesystem::path& path_;
  int number_;
};

/// Writes a file, and counts and digests what was written.
class Destination {
public:
  explicit Destination(const std::filesystem::path& path) : descriptor_(path, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC) {
    crypto_hash_sha256_init(&hash_);
  }

  void write(const unsigned char* bytes, std::size_t size) {
    crypto_hash_sha256_update(&hash_, bytes, size);
    descriptor_.writeAll(bytes, size);
    size_ += static_cast<std::int64_t>(size);
  }

  Copied finish() {
    std::array<unsigned char, crypto_hash_sha256_BYTES> digest{};
    crypto_hash_sha256_final(&hash_, digest.data());
    std::array<char, crypto_hash_sha256_BYTES * 2 + 1> text{};
    return {size_, sodium_bin2hex(text.data(), text.size(), digest.data(), digest.size())};
  }

private:
  Descriptor descriptor_;
  crypto_hash_sha256_state hash_{};
  std::int64_t size_ = 0;
};

/// A transfer that takes its time shall be seen to go on.
std::size_t bufferSize(const Pace& pace) {
  constexpr std::size_t large = std::size_t{1} << 20;
  constexpr std::size_t small = std::size_t{1} << 14;
  return pace ? small : large;
}

} // namespace

Copied copyFile(const std::filesystem::path& source, const std::filesystem::path& destination, const Pace& pace) {
  // Not blocking: a named pipe in place of a file would be waited for.
  const Descriptor input(source, O_RDONLY | O_CLOEXEC | O_NONBLOCK);
  input.requireRegularFile();
  Destination output(destination);
  std::vector<unsigned char> buffer(bufferSize(pace));
  while (const std::size_t count = input.readSome(buffer)) {
    output.write(buffer.data(), count);
    if (pace) {
      pace(count);
    }
  }
  return output.finish();
}

Copied writeContent(const std::string& content, const std::filesystem::path& destination) {
  Destination output(destination);
  output.write(reinterpret_cast<const unsigned char*>(content.data()), content.size());
  return output.finish();
}

} // namespace lumora::sandbox
