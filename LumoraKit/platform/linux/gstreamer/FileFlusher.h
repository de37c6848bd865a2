#pragma once

#include <LumoraKit/platform/Queues.h>

#include <filesystem>

namespace lumora::backend {

/// Takes a file that is being written from the kernel's memory to the disk once a second, so that a power failure
/// costs no more than a crash. Works on workers, as the disk may hang; ends with the object.
class FileFlusher : public std::enable_shared_from_this<FileFlusher> {
public:
  static std::shared_ptr<FileFlusher> start(const std::filesystem::path& file, const std::shared_ptr<Queues>& queues);

  FileFlusher(std::filesystem::path file, std::shared_ptr<Queues> queues);
  FileFlusher(const FileFlusher&) = delete;
  FileFlusher& operator=(const FileFlusher&) = delete;
  ~FileFlusher();

private:
  void flushInASecond();
  void flush();

  const std::filesystem::path file_;
  const std::shared_ptr<Queues> queues_;
  int descriptor_ = -1;
};

} // namespace lumora::backend
