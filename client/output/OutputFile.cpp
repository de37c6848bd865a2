#include "OutputFile.h"

#include "../Failure.h"
#include "Text.h"

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <string>

#include <fcntl.h>
#include <unistd.h>

namespace lumora::client {

namespace fs = std::filesystem;

namespace {

[[noreturn]] void fail(const fs::path& path, const std::string& reason) {
  throw Failure(exitCannotCreate, inQuotes(path.string()) + " cannot be written: " + reason + ".");
}

[[noreturn]] void failWithErrno(const fs::path& path) {
  fail(path, std::strerror(errno));
}

class Descriptor {
public:
  Descriptor(const fs::path& path, int flags) : descriptor_(open(path.c_str(), flags | O_CLOEXEC, 0666)) {
    if (descriptor_ < 0) {
      failWithErrno(path);
    }
  }
  Descriptor(const Descriptor&) = delete;
  Descriptor& operator=(const Descriptor&) = delete;
  ~Descriptor() { close(descriptor_); }
  int get() const { return descriptor_; }

private:
  int descriptor_;
};

/// False, with errno set, when it cannot be written whole.
bool writeAll(int descriptor, std::string_view content) {
  while (!content.empty()) {
    const ssize_t count = ::write(descriptor, content.data(), content.size());
    if (count < 0 && errno != EINTR) {
      return false;
    }
    content.remove_prefix(count < 0 ? 0 : static_cast<std::size_t>(count));
  }
  return true;
}

std::string contentOf(const fs::path& path) {
  const Descriptor file(path, O_RDONLY);
  std::string content;
  std::string part(std::size_t{64} * 1024, '\0');
  for (ssize_t count = 0; (count = read(file.get(), part.data(), part.size())) != 0;) {
    if (count < 0 && errno != EINTR) {
      failWithErrno(path);
    }
    content.append(part, 0, count < 0 ? 0 : static_cast<std::size_t>(count));
  }
  return content;
}

fs::path makeFolder(const fs::path& parent, const fs::path& path) {
  std::string name = parent / ".lumora-XXXXXX";
  if (mkdtemp(name.data()) == nullptr) {
    failWithErrno(path);
  }
  return name;
}

} // namespace

OutputFile::OutputFile(const fs::path& path) : path_(path) {
  std::error_code error;
  if (path != "-") {
    // A link stays one: what it leads to is replaced.
    path_ = fs::weakly_canonical(path, error);
    path_ = error ? fs::absolute(path) : path_;
  }
  const auto status = fs::status(path_, error);
  if (fs::is_directory(status)) {
    fail(path, "it is a folder");
  }
  if (path.empty() || path.filename().empty()) {
    fail(path, "it is no name of a file");
  }
  isReplaced_ = path != "-" && (!fs::exists(status) || fs::is_regular_file(status));
  folder_ = makeFolder(isReplaced_ ? path_.parent_path() : fs::temp_directory_path(), path);
  temporary_ = folder_ / (isReplaced_ ? path_.filename() : fs::path("content"));
}

OutputFile::~OutputFile() {
  std::error_code ignored;
  fs::remove_all(folder_, ignored);
}

void OutputFile::write(std::string_view content) const {
  const Descriptor file(temporary_, O_WRONLY | O_CREAT | O_TRUNC);
  if (!writeAll(file.get(), content)) {
    failWithErrno(path_);
  }
}

void OutputFile::commit() const {
  if (isReplaced_) {
    replace();
  } else {
    copy();
  }
}

void OutputFile::replace() const {
  if (fsync(Descriptor(temporary_, O_RDONLY).get()) != 0 || rename(temporary_.c_str(), path_.c_str()) != 0) {
    failWithErrno(path_);
  }
}

void OutputFile::copy() const {
  const std::string content = contentOf(temporary_);
  if (path_ == "-") {
    writeToStandardOutput(content);
  } else if (const Descriptor target(path_, O_WRONLY); !writeAll(target.get(), content)) {
    failWithErrno(path_);
  }
}

void writeToStandardOutput(std::string_view text) {
  if (writeAll(STDOUT_FILENO, text)) {
    return;
  }
  if (errno == EPIPE) {
    throw Interruption{SIGPIPE};
  }
  throw Failure(exitInputOutput, std::string("The output cannot be written: ") + std::strerror(errno) + ".");
}

} // namespace lumora::client
