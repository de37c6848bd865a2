#include <LumoraKit/platform/linux/gstreamer/FileFlusher.h>

#include <fcntl.h>
#include <unistd.h>

namespace lumora::backend {

std::shared_ptr<FileFlusher> FileFlusher::start(const std::filesystem::path& file,
                                                const std::shared_ptr<Queues>& queues) {
  auto flusher = std::make_shared<FileFlusher>(file, queues);
  flusher->flushInASecond();
  return flusher;
}

FileFlusher::FileFlusher(std::filesystem::path file, std::shared_ptr<Queues> queues)
    : file_(std::move(file)), queues_(std::move(queues)) {}

FileFlusher::~FileFlusher() {
  if (descriptor_ >= 0) {
    ::close(descriptor_);
  }
}

void FileFlusher::flushInASecond() {
  queues_->runAfter(std::chrono::seconds(1), queues_->concurrentQueue(), [weak = weak_from_this()] {
    if (const auto self = weak.lock()) {
      self->flush();
    }
  });
}

// Never two at once: the next one is arranged when this one has ended.
void FileFlusher::flush() {
  if (descriptor_ < 0) {
    descriptor_ = ::open(file_.c_str(), O_WRONLY | O_CLOEXEC);
  }
  if (descriptor_ >= 0) {
    ::fdatasync(descriptor_);
    flushInASecond();
  }
}

} // namespace lumora::backend
