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

std::string hexadecimal(const std::array<unsigned char, crypto_hash_sha256_BYTES>& digest) {
  std::array<char, crypto_hash_sha256_BYTES * 2 + 1> text{};
  return sodium_bin2hex(text.data(), text.size(), digest.data(), digest.size());
}

} // namespace

Copied copyFile(const std::filesystem::path& source, const std::filesystem::path& destination) {
  // Not blocking: a named pipe in place of a file would be waited for.
  const Descriptor input(source, O_RDONLY | O_CLOEXEC | O_NONBLOCK);
  input.requireRegularFile();
  const Descriptor output(destination, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC);

  crypto_hash_sha256_state hash;
  crypto_hash_sha256_init(&hash);
  Copied copied;
  std::vector<unsigned char> buffer(std::size_t{1} << 20);
  while (const std::size_t count = input.readSome(buffer)) {
    crypto_hash_sha256_update(&hash, buffer.data(), count);
    output.writeAll(buffer.data(), count);
    copied.size += static_cast<std::int64_t>(count);
  }
  std::array<unsigned char, crypto_hash_sha256_BYTES> digest{};
  crypto_hash_sha256_final(&hash, digest.data());
  copied.sha256 = hexadecimal(digest);
  return copied;
}

} // namespace lumora::sandbox
