#include <LumoraKit/testing/FakeFiles.h>

#include <cerrno>

namespace lumora::fakes {
namespace {

// A path without dots and without a separator at its end.
std::filesystem::path cleaned(const std::filesystem::path& path) {
  auto clean = path.lexically_normal();
  return clean.has_filename() || clean == clean.root_path() ? clean : clean.parent_path();
}

LMRErrorRef errorUnlessZero(int errorNumber, const std::filesystem::path& path) {
  return errorNumber == 0 ? nullptr : LMRError::fromErrno(errorNumber, path.string());
}

void report(LMRErrorRef* error, int errorNumber, const std::filesystem::path& path) {
  if (error) {
    *error = LMRError::fromErrno(errorNumber, path.string());
  }
}

} // namespace

FakeFiles::FakeFiles() : applicationSupport_{"/home/user/.local/share"} {}
FakeFiles::~FakeFiles() = default;

std::vector<std::filesystem::path> FakeFiles::applicationSupportDirectories() {
  const std::lock_guard lock(mutex_);
  return applicationSupport_;
}

bool FakeFiles::isDirectory(const std::filesystem::path& path) {
  const std::lock_guard lock(mutex_);
  return hasDirectory(cleaned(path));
}

bool FakeFiles::isFile(const std::filesystem::path& path) {
  const std::lock_guard lock(mutex_);
  return files_.contains(cleaned(path));
}

std::vector<std::filesystem::path> FakeFiles::contentsOfDirectory(const std::filesystem::path& path,
                                                                  LMRErrorRef* error) {
  const std::lock_guard lock(mutex_);
  const auto clean = cleaned(path);
  if (!hasDirectory(clean)) {
    report(error, ENOENT, path);
    return {};
  }
  std::set<std::filesystem::path> contents;
  for (const auto& [file, content] : files_) {
    contents.insert(file);
  }
  contents.insert(directories_.begin(), directories_.end());
  std::erase_if(contents, [&](const auto& entry) { return entry == clean || entry.parent_path() != clean; });
  return {contents.begin(), contents.end()};
}

std::optional<std::string> FakeFiles::contentOfFile(const std::filesystem::path& path, LMRErrorRef* error) {
  auto found = content(path);
  if (!found) {
    report(error, ENOENT, path);
  }
  return found;
}

std::optional<std::uint64_t> FakeFiles::sizeOfFile(const std::filesystem::path& path, LMRErrorRef* error) {
  const std::lock_guard lock(mutex_);
  const auto clean = cleaned(path);
  const auto found = files_.find(clean);
  if (found == files_.end()) {
    report(error, hasDirectory(clean) ? EINVAL : ENOENT, path);
    return std::nullopt;
  }
  return found->second.size();
}

std::optional<std::string> FakeFiles::partOfFile(const std::filesystem::path& path, std::uint64_t offset,
                                                 std::size_t length, LMRErrorRef* error) {
  const std::lock_guard lock(mutex_);
  const auto found = files_.find(cleaned(path));
  if (found == files_.end()) {
    report(error, ENOENT, path);
    return std::nullopt;
  }
  const std::string& content = found->second;
  return offset < content.size() ? content.substr(static_cast<std::size_t>(offset), length) : std::string();
}

LMRErrorRef FakeFiles::truncateFile(const std::filesystem::path& path, std::uint64_t length) {
  const std::lock_guard lock(mutex_);
  const auto found = files_.find(cleaned(path));
  int error = failure_;
  if (error == 0 && found == files_.end()) {
    error = ENOENT;
  }
  if (error == 0 && length > found->second.size()) {
    error = EINVAL;
  }
  if (error == 0) {
    found->second.resize(static_cast<std::size_t>(length));
  }
  return errorUnlessZero(error, path);
}

std::shared_ptr<void> FakeFiles::lockFile(const std::filesystem::path& path, LMRErrorRef* error) {
  const std::lock_guard lock(mutex_);
  std::weak_ptr<void>& holder = locks_[cleaned(path)];
  if (!holder.expired() || failure_ != 0) {
    report(error, failure_ != 0 ? failure_ : EWOULDBLOCK, path);
    return nullptr;
  }
  auto taken = std::make_shared<int>();
  holder = taken;
  return taken;
}

LMRErrorRef FakeFiles::createDirectory(const std::filesystem::path& path) {
  const std::lock_guard lock(mutex_);
  const auto clean = cleaned(path);
  if (hasDirectory(clean)) {
    return nullptr;
  }
  return errorUnlessZero(failure_ != 0 ? failure_ : createParents(clean), path);
}

LMRErrorRef FakeFiles::writeAtomically(const std::filesystem::path& path, std::string_view content) {
  const std::lock_guard lock(mutex_);
  const auto clean = cleaned(path);
  int error = failure_;
  if (error == 0 && !hasDirectory(clean.parent_path())) {
    error = ENOENT;
  }
  if (error == 0 && hasDirectory(clean)) {
    error = EISDIR;
  }
  if (error == 0) {
    files_[clean] = content;
  }
  return errorUnlessZero(error, path);
}

LMRErrorRef FakeFiles::removeFile(const std::filesystem::path& path) {
  const std::lock_guard lock(mutex_);
  const auto clean = cleaned(path);
  int error = failure_;
  if (error == 0 && files_.erase(clean) == 0) {
    error = hasDirectory(clean) ? EISDIR : ENOENT;
  }
  return errorUnlessZero(error, path);
}

void FakeFiles::setApplicationSupportDirectories(std::vector<std::filesystem::path> directories) {
  const std::lock_guard lock(mutex_);
  applicationSupport_ = std::move(directories);
}

std::optional<std::uint64_t> FakeFiles::availableSpace(const std::filesystem::path&) {
  const std::lock_guard lock(mutex_);
  return availableSpace_;
}

void FakeFiles::setAvailableSpace(std::optional<std::uint64_t> bytes) {
  const std::lock_guard lock(mutex_);
  availableSpace_ = bytes;
}

void FakeFiles::setFailure(int errorNumber) {
  const std::lock_guard lock(mutex_);
  failure_ = errorNumber;
}

std::optional<std::string> FakeFiles::content(const std::filesystem::path& path) const {
  const std::lock_guard lock(mutex_);
  const auto found = files_.find(cleaned(path));
  return found == files_.end() ? std::nullopt : std::optional(found->second);
}

std::vector<std::filesystem::path> FakeFiles::files() const {
  const std::lock_guard lock(mutex_);
  std::vector<std::filesystem::path> paths;
  for (const auto& [path, content] : files_) {
    paths.push_back(path);
  }
  return paths;
}

bool FakeFiles::hasDirectory(const std::filesystem::path& path) const {
  return directories_.contains(path);
}

int FakeFiles::createParents(const std::filesystem::path& path) {
  std::filesystem::path current;
  for (const auto& part : path) {
    current /= part;
    if (files_.contains(current)) {
      return EEXIST;
    }
    directories_.insert(current);
  }
  return 0;
}

} // namespace lumora::fakes
