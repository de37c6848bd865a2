#include "Staging.h"

#include "../Status.h"
#include "../store/Uploads.h"

#include <cerrno>
#include <system_error>

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

namespace lumora::sandbox {

namespace fs = std::filesystem;

namespace {

constexpr const char* interrupted = "the transfer was interrupted";

int openFolder(const fs::path& folder) {
  return open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
}

/// Removes a staging folder that no process holds.
void clearIncoming(Store& store, const fs::path& folder) {
  const int lock = openFolder(folder);
  if (lock < 0) {
    return;
  }
  if (flock(lock, LOCK_EX | LOCK_NB) == 0) {
    std::error_code ignored;
    fs::remove_all(folder, ignored);
    failUpload(store, folder.filename().string(), interrupted);
  }
  close(lock);
}

/// Removes a filed folder whose process died before the episode was recorded.
void clearUnrecorded(Store& store, const fs::path& folder) {
  const std::string uuid = folder.filename().string();
  if (!episodeExists(store, uuid)) {
    std::error_code ignored;
    fs::remove_all(folder, ignored);
    failUpload(store, uuid, interrupted);
  }
}

} // namespace

Staging::Staging(const Store& store) : store_(store) {
  while (!makeFolder()) {
  }
}

Staging::~Staging() {
  if (!isKept_) {
    std::error_code ignored;
    fs::remove_all(folder_, ignored);
  }
  close(lock_);
}

/// False when somebody cleared the folder away before it was locked.
bool Staging::makeFolder() {
  uuid_ = makeUUIDString();
  folder_ = store_.incomingFolder() / uuid_;
  fs::create_directory(folder_);
  lock_ = openFolder(folder_);
  if (lock_ < 0 && errno != ENOENT) {
    throw std::system_error(errno, std::generic_category(), folder_.string());
  }
  if (lock_ >= 0 && flock(lock_, LOCK_EX) == 0 && fs::exists(folder_)) {
    return true;
  }
  close(lock_);
  return false;
}

StoredFile Staging::add(const fs::path& source, const Pace& pace) {
  const std::string name = source.filename().string();
  const std::string storedName = nextName(name);
  const Copied copied = copyFile(source, folder_ / storedName, pace);
  return {name, storedName, copied.size, copied.sha256};
}

// Numbered, because files from several folders may have one name. A file system takes names of 255 bytes: of a longer
// one the end is kept, from the beginning of a character on (UTF-8).
std::string Staging::nextName(const std::string& name) {
  constexpr std::size_t most = 200;
  std::size_t begin = name.size() > most ? name.size() - most : 0;
  while (begin < name.size() && begin > 0 && (static_cast<unsigned char>(name[begin]) & 0xC0U) == 0x80U) {
    ++begin;
  }
  return std::to_string(++count_) + "-" + name.substr(begin);
}

StoredFile Staging::addContent(const std::string& name, const std::string& content) {
  const std::string storedName = nextName(name);
  const Copied copied = writeContent(content, folder_ / storedName);
  return {name, storedName, copied.size, copied.sha256};
}

void Staging::publish() {
  const fs::path filed = folderOf(store_, uuid_);
  fs::rename(folder_, filed);
  folder_ = filed;
}

std::int64_t bytesOfUpload(const Store& store, const std::string& uuid) {
  std::int64_t sum = 0;
  std::error_code ignored;
  // The folder may go away at any moment.
  for (fs::directory_iterator entry(store.incomingFolder() / uuid, ignored), end; entry != end;
       entry.increment(ignored)) {
    const auto size = entry->file_size(ignored);
    sum += ignored ? 0 : static_cast<std::int64_t>(size);
  }
  return sum;
}

void clearAway(Store& store) {
  for (const auto& entry : fs::directory_iterator(store.incomingFolder())) {
    clearIncoming(store, entry.path());
  }
  // A folder is filed and recorded in one change: none is halfway while this one lasts.
  store.change([&] {
    for (const auto& entry : fs::directory_iterator(store.submissionsFolder())) {
      clearUnrecorded(store, entry.path());
    }
  });
}

} // namespace lumora::sandbox
