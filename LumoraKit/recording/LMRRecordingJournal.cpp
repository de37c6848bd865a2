#include <LumoraKit/actions/LMRApplicationSupportDirectory.h>
#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/recording/LMRRecordingJournal.h>

#include <algorithm>
#include <cerrno>
#include <tuple>
#include <utility>

// Two files a note: "<identifier>.plist", and "<identifier>.lock", which is locked while somebody has the note open. A
// lock is taken before its note is written, and removed after it, so whoever gets the lock of a note that is there has
// the note. Identifiers are never used again: the lock of a note that is gone protects nothing.

namespace fs = std::filesystem;
using lumora::Platform;

namespace {

constexpr std::string_view noteExtension = ".plist";
constexpr std::string_view lockExtension = ".lock";

LMRErrorRef refusal(const std::string& why) {
  return LMRError::make(LMRRecordingJournalErrorDomain, 1, why);
}

void report(LMRErrorRef* error, LMRErrorRef value) {
  if (error) {
    *error = std::move(value);
  }
}

} // namespace

std::shared_ptr<LMRRecordingJournal> LMRRecordingJournal::journalWithError(LMRErrorRef* error) {
  const auto folder = LMRApplicationSupportDirectory();
  if (!folder) {
    report(error, refusal("There is no folder for the application's data"));
    return nullptr;
  }
  return journalWithFolder_error(fs::path(*folder) / "Recordings", error);
}

std::shared_ptr<LMRRecordingJournal> LMRRecordingJournal::journalWithFolder_error(const fs::path& folder,
                                                                                  LMRErrorRef* error) {
  if (LMRErrorRef reason = Platform::current().files->createDirectory(folder)) {
    report(error, std::move(reason));
    return nullptr;
  }
  return std::make_shared<LMRRecordingJournal>(MadeByFactory(), folder);
}

LMRRecordingJournal::LMRRecordingJournal(MadeByFactory, fs::path folder) : folder_(std::move(folder)) {}

LMRRecordingJournal::~LMRRecordingJournal() = default;

LMRErrorRef LMRRecordingJournal::open(LMRRecordingNote& note) {
  const std::lock_guard guard(mutex_);
  LMRRecordingNote opened = note;
  opened.identifier = lumora::makeUUIDString();
  const auto& files = Platform::current().files;
  LMRErrorRef error;
  auto lock = files->lockFile(lockFile(opened.identifier), &error);
  error = lock ? write(opened) : error;
  if (error) {
    files->removeFile(lockFile(opened.identifier));
    return error;
  }
  open_[opened.identifier] = std::move(lock);
  note = std::move(opened);
  return nullptr;
}

LMRErrorRef LMRRecordingJournal::update(const LMRRecordingNote& note) {
  const std::lock_guard guard(mutex_);
  return isOpen(note.identifier) ? write(note) : refusal("The recording is not noted here");
}

LMRErrorRef LMRRecordingJournal::close(const std::string& identifier) {
  const std::lock_guard guard(mutex_);
  if (!isOpen(identifier)) {
    return refusal("The recording is not noted here");
  }
  const auto& files = Platform::current().files;
  LMRErrorRef error = files->removeFile(noteFile(identifier));
  if (!error) {
    if (const LMRErrorRef left = files->removeFile(lockFile(identifier))) {
      lumora::log("%@ cannot be removed: %@", {lockFile(identifier).string(), left->localizedDescription()});
    }
    open_.erase(identifier);
  }
  return error;
}

std::vector<LMRRecordingNote> LMRRecordingJournal::takeUnfinished() {
  const std::lock_guard guard(mutex_);
  std::vector<LMRRecordingNote> taken;
  LMRErrorRef error;
  for (const auto& file : Platform::current().files->contentsOfDirectory(folder_, &error)) {
    auto note = file.extension() == noteExtension ? take(file) : std::nullopt;
    if (note) {
      taken.push_back(std::move(*note));
    }
  }
  if (error) {
    lumora::log("The notes of recordings in %@ cannot be read: %@", {folder_.string(), error->localizedDescription()});
  }
  std::ranges::sort(taken, {}, [](const LMRRecordingNote& note) { return std::tie(note.began, note.identifier); });
  return taken;
}

fs::path LMRRecordingJournal::noteFile(const std::string& identifier) const {
  return folder_ / (identifier + std::string(noteExtension));
}

fs::path LMRRecordingJournal::lockFile(const std::string& identifier) const {
  return folder_ / (identifier + std::string(lockExtension));
}

LMRErrorRef LMRRecordingJournal::write(const LMRRecordingNote& note) const {
  LMRErrorRef error;
  const auto text = lumora::xmlDescription(note.dictionaryRepresentation(), &error);
  return text ? Platform::current().files->writeAtomically(noteFile(note.identifier), *text) : error;
}

// One that has just been closed needs no word.
std::optional<LMRRecordingNote> LMRRecordingJournal::read(const fs::path& file, bool& isGone) const {
  LMRErrorRef error;
  const auto text = Platform::current().files->contentOfFile(file, &error);
  const auto dictionary = text ? lumora::dictionaryWithXMLDescription_error(*text, &error) : std::nullopt;
  auto note = dictionary ? LMRRecordingNote::noteWithDictionary(*dictionary) : std::nullopt;
  isGone = !text && error->code() == ENOENT;
  if (note && noteFile(note->identifier) == file) {
    return note;
  }
  if (!isGone) {
    lumora::log("The note of a recording in %@ cannot be read: %@",
                {file.string(), error ? error->localizedDescription() : "it is not complete"});
  }
  return std::nullopt;
}

// It is read again under the lock: whoever had it may have changed or closed it meanwhile.
std::optional<LMRRecordingNote> LMRRecordingJournal::take(const fs::path& file) {
  bool isGone = false;
  auto note = read(file, isGone);
  const auto& files = Platform::current().files;
  LMRErrorRef error;
  auto lock = note ? files->lockFile(lockFile(note->identifier), &error) : nullptr;
  if (!lock) {
    if (error && error->code() != EWOULDBLOCK) {
      lumora::log("The note of a recording in %@ cannot be taken: %@", {file.string(), error->localizedDescription()});
    }
    return std::nullopt;
  }
  const std::string identifier = note->identifier;
  note = read(file, isGone);
  if (note) {
    open_[identifier] = std::move(lock);
  } else if (isGone) {
    files->removeFile(lockFile(identifier));
  }
  return note;
}

bool LMRRecordingJournal::isOpen(const std::string& identifier) const {
  return open_.contains(identifier);
}
