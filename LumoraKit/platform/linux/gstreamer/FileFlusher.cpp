#include <LumoraKit/platform/linux/gstreamer/FileFlusher.h>

#include <fcntl.h>
#include <unistd.h>

namespace lumora::backend {

FileFlusher::FileFlusher(const std::filesystem::path& file)
    : descriptor_(::open(file.c_str(), O_WRONLY | O_CLOEXEC)), last_(std::chrono::steady_clock::now()) {}

FileFlusher::~FileFlusher() {
  if (descriptor_ >= 0) {
    ::close(descriptor_);
  }
}

void FileFlusher::flushOnceASecond() {
  const auto now = std::chrono::steady_clock::now();
  if (descriptor_ >= 0 && now - last_ >= std::chrono::seconds(1)) {
    ::fdatasync(descriptor_);
    last_ = now;
  }
}

} // namespace lumora::backend
