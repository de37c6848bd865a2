#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/AtomicFile.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/FileLock.h>
#include <LumoraKit/platform/linux/FilePreferences.h>
#include <LumoraKit/platform/linux/UserFolders.h>

#include <cerrno>
#include <cstdio>

#include <sys/stat.h>

namespace lumora::backend {
namespace {

constexpr mode_t folderPermissions = 0700;
constexpr unsigned char firstPrintable = 0x20;

// A file name for any domain, each its own: what would lead out of the folder is written as %XX.
std::string fileName(std::string_view domain) {
  constexpr std::string_view digits = "0123456789ABCDEF";
  std::string name;
  for (const char character : domain) {
    const auto byte = static_cast<unsigned char>(character);
    if (character == '/' || character == '%' || byte < firstPrintable) {
      name += {'%', digits[byte >> 4U], digits[byte & 0x0FU]};
    } else {
      name += character;
    }
  }
  return name;
}

LMRErrorRef setAside(const std::filesystem::path& path, const LMRErrorRef& damage) {
  auto aside = path;
  aside += ".damaged-" + makeUUIDString();
  if (std::rename(path.c_str(), aside.c_str()) != 0) {
    return LMRError::fromErrno(errno, aside.string());
  }
  log("Preferences file %@ is damaged and was kept as %@: %@", {text(path), text(aside), text(damage)});
  return nullptr;
}

// Reads what is stored, under the lock. A missing file is an empty one.
LMRErrorRef load(const std::filesystem::path& path, Dictionary& stored) {
  const auto content = contentOfFile(path);
  if (!content) {
    return errno == ENOENT ? nullptr : LMRError::fromErrno(errno, path.string());
  }
  LMRErrorRef damage;
  auto parsed = dictionaryWithXMLDescription_error(*content, &damage);
  if (!parsed) {
    return setAside(path, damage);
  }
  stored = std::move(*parsed);
  return nullptr;
}

// False when that is what the dictionary holds already.
bool change(Dictionary& stored, std::string_view key, const std::optional<Value>& value) {
  if (!value) {
    return stored.remove(key);
  }
  const Value* const present = stored.find(key);
  if (present && *present == *value) {
    return false;
  }
  stored.set(key, *value);
  return true;
}

LMRErrorRef unseen() {
  return LMRError::make(LMRPosixErrorDomain, EIO, "The present value could not be read before");
}

// isSeen: whether the caller knows what there is; otherwise only a new key is stored.
LMRErrorRef update(const std::filesystem::path& folder, std::string_view domain, std::string_view key,
                   const std::optional<Value>& value, bool isSeen) {
  if (folder.empty()) {
    return LMRError::fromErrno(ENOENT, "home folder");
  }
  if (LMRErrorRef error = makeDirectories(folder, folderPermissions)) {
    return error;
  }
  const auto name = fileName(domain);
  const auto path = folder / (name + ".plist");
  // On a file of its own: the preferences file is another one after each change.
  FileLock lock;
  Dictionary stored;
  LMRErrorRef error = lock.take(folder / ("." + name + ".lock"));
  if (!error) {
    error = load(path, stored);
  }
  if (!error && !isSeen && stored.find(key)) {
    error = unseen();
  }
  if (error || !change(stored, key, value)) {
    return error;
  }
  const auto content = xmlDescription(stored, &error);
  return content ? replaceFile(path, *content) : error;
}

} // namespace

std::optional<Value> FilePreferences::value(std::string_view domain, std::string_view key) {
  // Without the lock: a file is only ever replaced as a whole.
  const auto path = folder_ / (fileName(domain) + ".plist");
  const auto content = folder_.empty() ? std::nullopt : contentOfFile(path);
  const bool isSeen = content || folder_.empty() || errno == ENOENT;
  if (!isSeen) {
    const LMRErrorRef error = LMRError::fromErrno(errno, path.string());
    log("Cannot read the preference %@ of %@: %@", {text(key), text(domain), text(error)});
  }
  noteSeen(domain, key, isSeen);
  const auto stored = content ? dictionaryWithXMLDescription(*content) : std::nullopt;
  const Value* const found = stored ? stored->find(key) : nullptr;
  return found ? std::optional(*found) : std::nullopt;
}

void FilePreferences::setValue(std::string_view domain, std::string_view key, const std::optional<Value>& value) {
  const bool isSeen = noteSeen(domain, key, true);
  if (const LMRErrorRef error = update(folder_, domain, key, value, isSeen)) {
    log("Cannot save the preference %@ of %@: %@", {text(key), text(domain), text(error)});
  }
}

bool FilePreferences::noteSeen(std::string_view domain, std::string_view key, bool isSeen) {
  const std::lock_guard guard(mutex_);
  Key unseen{domain, key};
  if (isSeen) {
    return unseen_.erase(unseen) == 0;
  }
  return unseen_.insert(std::move(unseen)).second;
}

std::shared_ptr<Preferences> makePreferences() {
  return std::make_shared<FilePreferences>(userConfigurationFolder());
}

} // namespace lumora::backend
