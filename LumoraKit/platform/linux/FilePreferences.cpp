#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/AtomicFile.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>
#include <LumoraKit/platform/linux/FilePreferences.h>
#include <LumoraKit/platform/linux/UserFolders.h>

#include <array>
#include <cerrno>
#include <cstdio>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr mode_t folderPermissions = 0700;
constexpr mode_t lockPermissions = 0600;
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

// The whole content; nothing, with errno set, when it cannot be read.
std::optional<std::string> contentOf(const std::filesystem::path& path) {
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

// Waits its turn among all threads and processes. The lock is on a file of its own: the preferences file is another
// one after each change.
LMRErrorRef lockFile(const std::filesystem::path& path, FileDescriptor& lock) {
  lock = FileDescriptor(open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, lockPermissions));
  if (!lock.isOpen()) {
    return LMRError::fromErrno(errno, path.string());
  }
  while (flock(lock.get(), LOCK_EX) != 0) {
    if (errno != EINTR) {
      return LMRError::fromErrno(errno, path.string());
    }
  }
  return nullptr;
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
  const auto content = contentOf(path);
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

LMRErrorRef update(const std::filesystem::path& folder, std::string_view domain, std::string_view key,
                   const std::optional<Value>& value) {
  if (folder.empty()) {
    return LMRError::fromErrno(ENOENT, "home folder");
  }
  if (LMRErrorRef error = makeDirectories(folder, folderPermissions)) {
    return error;
  }
  const auto name = fileName(domain);
  const auto path = folder / (name + ".plist");
  FileDescriptor lock;
  Dictionary stored;
  LMRErrorRef error = lockFile(folder / ("." + name + ".lock"), lock);
  if (!error) {
    error = load(path, stored);
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
  const auto content = folder_.empty() ? std::nullopt : contentOf(folder_ / (fileName(domain) + ".plist"));
  const auto stored = content ? dictionaryWithXMLDescription(*content) : std::nullopt;
  const Value* const found = stored ? stored->find(key) : nullptr;
  return found ? std::optional(*found) : std::nullopt;
}

void FilePreferences::setValue(std::string_view domain, std::string_view key, const std::optional<Value>& value) {
  if (const LMRErrorRef error = update(folder_, domain, key, value)) {
    log("Cannot save the preference %@ of %@: %@", {text(key), text(domain), text(error)});
  }
}

std::shared_ptr<Preferences> makePreferences() {
  return std::make_shared<FilePreferences>(userConfigurationFolder());
}

} // namespace lumora::backend
