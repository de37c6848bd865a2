#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRApplicationSupportDirectory.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <iterator>
#include <utility>

// One property list an entry, "<identifier>.plist". An entry is written before it counts and removed after the server
// has taken it, so a process that is killed leaves at worst one that was filed; the server then refuses it.

namespace fs = std::filesystem;
using lumora::Platform;

namespace {

constexpr std::string_view orderKey = "order";
constexpr std::string_view extension = ".plist";
constexpr std::chrono::seconds firstPause{15};
constexpr std::chrono::seconds longestPause{900};
// "Failed to complete submission": what a submission UUID that was filed already is refused with.
constexpr std::int64_t notCompletedStatus = 34;

void requireMainThread(std::string_view operation) {
  lumora::assertThat(Platform::current().mainThread->isCurrent(), "on the main thread", operation,
                     "LMRSubmissionQueue");
}

void report(LMRErrorRef* error, LMRErrorRef value) {
  if (error) {
    *error = std::move(value);
  }
}

LMRErrorRef refusal(const std::string& why) {
  return LMRError::make(LMRSubmissionQueueErrorDomain, 1, why);
}

std::chrono::seconds pauseAfter(std::uint32_t attempts) {
  constexpr std::uint32_t doublings = 6;
  const std::uint32_t before = std::max(attempts, 1U) - 1;
  return std::min(firstPause * (1U << std::min(before, doublings)), longestPause);
}

bool isGone(const LMRErrorRef& error) {
  return error->code() == ENOENT || error->code() == ENOTDIR;
}

// What the action was given on disk; nobody else removes it.
std::vector<fs::path> metadataFiles(const LMRAction& action) {
  std::vector<fs::path> files;
  const auto arguments = action.arguments().value_or(lumora::Array());
  for (const auto& argument : arguments) {
    const lumora::Array* const pair = argument.array();
    const bool isMetadata =
        pair && pair->size() == 2 &&
        (pair->front() == lumora::Value("metadata") || pair->front() == lumora::Value("recording_metadata"));
    const std::string* const path = isMetadata ? pair->back().string() : nullptr;
    if (path) {
      files.emplace_back(*path);
    }
  }
  return files;
}

// False when it is still there.
bool isRemoved(const fs::path& file) {
  const LMRErrorRef error = Platform::current().files->removeFile(file);
  if (error && !isGone(error)) {
    lumora::log("The metadata file %@ cannot be removed: %@", {file.string(), error->localizedDescription()});
  }
  return !error || isGone(error);
}

} // namespace

std::shared_ptr<LMRSubmissionQueue> LMRSubmissionQueue::queueWithError(LMRErrorRef* error) {
  const auto folder = LMRApplicationSupportDirectory();
  if (!folder) {
    report(error, refusal("There is no folder for the application's data"));
    return nullptr;
  }
  return queueWithFolder_error(fs::path(*folder) / "Submissions", error);
}

std::shared_ptr<LMRSubmissionQueue> LMRSubmissionQueue::queueWithFolder_error(const fs::path& folder,
                                                                              LMRErrorRef* error) {
  requireMainThread("queueWithFolder:error:");
  const auto& files = Platform::current().files;
  LMRErrorRef reason = files->createDirectory(folder);
  auto lock = reason ? nullptr : files->lockFile(folder / "lock", &reason);
  auto queue = lock ? std::make_shared<LMRSubmissionQueue>(MadeByFactory(), folder, std::move(lock)) : nullptr;
  reason = queue ? queue->load() : reason;
  if (reason) {
    queue.reset();
    report(error, reason);
  }
  return queue;
}

LMRSubmissionQueue::LMRSubmissionQueue(MadeByFactory, fs::path folder, std::shared_ptr<void> lock)
    : folder_(std::move(folder)), lock_(std::move(lock)) {}

LMRSubmissionQueue::~LMRSubmissionQueue() {
  std::erase_if(metadataFiles_, isRemoved);
}

// What is kept on disk.

LMRErrorRef LMRSubmissionQueue::load() {
  LMRErrorRef error;
  for (const auto& file : Platform::current().files->contentsOfDirectory(folder_, &error)) {
    if (file.extension() == extension) {
      loadEntry(file);
    }
  }
  std::ranges::sort(entries_, {}, &Entry::order);
  return error;
}

void LMRSubmissionQueue::loadEntry(const fs::path& file) {
  LMRErrorRef error;
  const auto text = Platform::current().files->contentOfFile(file, &error);
  const auto dictionary = text ? lumora::dictionaryWithXMLDescription_error(*text, &error) : std::nullopt;
  auto submission = dictionary ? LMRSubmission::submissionWithDictionary(*dictionary) : std::nullopt;
  if (!submission || fileOf(*submission) != file) {
    lumora::log("The submission in %@ cannot be read: %@",
                {file.string(), error ? error->localizedDescription() : "it is not complete"});
    return;
  }
  const lumora::Value* const order = dictionary->find(orderKey);
  entries_.push_back({std::move(*submission), order ? order->unsignedInteger().value_or(0) : 0});
}

fs::path LMRSubmissionQueue::fileOf(const LMRSubmission& submission) const {
  return folder_ / (submission.identifier + std::string(extension));
}

LMRErrorRef LMRSubmissionQueue::save(const Entry& entry) const {
  auto dictionary = entry.submission.dictionaryRepresentation();
  dictionary.set(orderKey, entry.order);
  LMRErrorRef error;
  const auto text = lumora::xmlDescription(dictionary, &error);
  error = text ? Platform::current().files->writeAtomically(fileOf(entry.submission), *text) : error;
  if (error) {
    lumora::log("The submission of %@ cannot be kept: %@",
                {entry.submission.file.string(), error->localizedDescription()});
  }
  return error;
}

LMRErrorRef LMRSubmissionQueue::erase(const std::string& identifier) {
  const Entry* const entry = find(identifier);
  LMRErrorRef error = Platform::current().files->removeFile(fileOf(entry->submission));
  if (!error) {
    std::erase_if(entries_, [&](const Entry& candidate) { return candidate.submission.identifier == identifier; });
  }
  return error;
}

LMRSubmissionQueue::Entry* LMRSubmissionQueue::find(const std::string& identifier) {
  const auto found =
      std::ranges::find_if(entries_, [&](const Entry& entry) { return entry.submission.identifier == identifier; });
  return found == entries_.end() ? nullptr : &*found;
}

// What the application asks for.

std::vector<LMRSubmission> LMRSubmissionQueue::submissions() const {
  std::vector<LMRSubmission> submissions;
  for (const Entry& entry : entries_) {
    submissions.push_back(entry.submission);
  }
  return submissions;
}

LMRErrorRef LMRSubmissionQueue::add(LMRSubmission submission, const LMRSession& session) {
  requireMainThread("add:session:");
  if (!submission.file.is_absolute() || submission.submissionUUID.empty()) {
    return refusal("A submission needs the full path of its file, and a submission UUID");
  }
  submission.identifier = lumora::makeUUIDString();
  submission.server = session.server().value_or("");
  submission.port = session.port();
  submission.userName = session.userName().value_or("");
  submission.state = LMRSubmission::State::Waiting;
  submission.attempts = 0;
  submission.lastError.reset();
  Entry entry{std::move(submission), entries_.empty() ? 0 : entries_.back().order + 1};
  if (LMRErrorRef error = save(entry)) {
    return error;
  }
  entries_.push_back(std::move(entry));
  postChange();
  proceed();
  return nullptr;
}

void LMRSubmissionQueue::setSession(std::shared_ptr<LMRSession> session) {
  requireMainThread("setSession:");
  session_ = std::move(session);
  for (Entry& entry : entries_) {
    entry.isPausing = false;
  }
  proceed();
}

void LMRSubmissionQueue::retry(const std::string& identifier) {
  requireMainThread("retry:");
  Entry* const entry = find(identifier);
  if (!entry || identifier == current_) {
    return;
  }
  entry->isPausing = false;
  entry->submission.state = LMRSubmission::State::Waiting;
  save(*entry);
  postChange();
  proceed();
}

LMRErrorRef LMRSubmissionQueue::remove(const std::string& identifier) {
  requireMainThread("remove:");
  if (identifier == current_) {
    return refusal("The file is being submitted");
  }
  LMRErrorRef error = find(identifier) ? erase(identifier) : refusal("There is no such submission");
  if (!error) {
    postChange();
  }
  return error;
}

// One submission after another.

LMRSubmissionQueue::Entry* LMRSubmissionQueue::nextEntry() {
  const auto isDue = [this](const Entry& entry) {
    return entry.submission.state == LMRSubmission::State::Waiting && !entry.isPausing &&
           entry.submission.isFor(*session_);
  };
  const auto found = session_ ? std::ranges::find_if(entries_, isDue) : entries_.end();
  return found == entries_.end() ? nullptr : &*found;
}

void LMRSubmissionQueue::proceed() {
  while (current_.empty()) {
    Entry* const entry = nextEntry();
    if (!entry) {
      return;
    }
    begin(*entry);
  }
}

// The tool removes a file that is to be deleted only when the server has it. One that only cannot be looked at is not
// removed.
void LMRSubmissionQueue::begin(Entry& entry) {
  LMRSubmission& submission = entry.submission;
  LMRErrorRef error;
  if (Platform::current().files->sizeOfFile(submission.file, &error)) {
    ++submission.attempts;
    submission.state = LMRSubmission::State::Submitting;
    current_ = submission.identifier;
    save(entry);
    startAction(submission);
    postChange();
  } else if (!isGone(error)) {
    fail(entry, error->localizedDescription(), false);
  } else if (submission.deleteAfterSubmission && submission.attempts > 0) {
    complete(LMRSubmission(submission));
  } else {
    fail(entry, "The recorded file is not there any more", true);
  }
}

void LMRSubmissionQueue::startAction(const LMRSubmission& submission) {
  const auto recordingMetadata =
      submission.recordingMetadata.empty() ? std::nullopt : std::optional(submission.recordingMetadata);
  const auto action = LMRActionFactory::
      actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
          submission.file.string(), submission.submissionUUID, submission.userMetadata, recordingMetadata, false,
          submission.deleteAfterSubmission, session_);
  action->setFinishTarget_selector(shared_from_this(), &LMRSubmissionQueue::submittedWithAction);
  action->setErrorTarget_selector(shared_from_this(), &LMRSubmissionQueue::failedWithAction);
  action->start();
}

LMRSubmissionQueue::Entry* LMRSubmissionQueue::endOfAction(const std::shared_ptr<LMRAction>& action) {
  std::ranges::move(metadataFiles(*action), std::back_inserter(metadataFiles_));
  std::erase_if(metadataFiles_, isRemoved);
  return find(std::exchange(current_, {}));
}

void LMRSubmissionQueue::submittedWithAction(const std::shared_ptr<LMRAction>& action) {
  complete(LMRSubmission(endOfAction(action)->submission));
  proceed();
}

void LMRSubmissionQueue::failedWithAction(const std::shared_ptr<LMRAction>& action) {
  const auto error = action->error();
  lumora::log("The submission of %@ failed: %@",
              {find(current_)->submission.file.string(), error->localizedDescription()});
  fail(*endOfAction(action), error->localizedDescription(), error->code() == notCompletedStatus);
  proceed();
}

// An entry that cannot be removed from the disk must not be submitted again by this process.
void LMRSubmissionQueue::complete(const LMRSubmission& submission) {
  if (const LMRErrorRef error = erase(submission.identifier)) {
    fail(*find(submission.identifier), error->localizedDescription(), true);
    return;
  }
  Platform::current().notificationCenter->post(LMRSubmissionQueueDidSubmitNotification, submission);
  postChange();
}

void LMRSubmissionQueue::fail(Entry& entry, const std::string& reason, bool isFinal) {
  entry.submission.lastError = reason;
  entry.submission.state = isFinal ? LMRSubmission::State::Held : LMRSubmission::State::Waiting;
  if (!isFinal) {
    pause(entry);
  }
  save(entry);
  postChange();
}

void LMRSubmissionQueue::pause(Entry& entry) {
  entry.isPausing = true;
  ++entry.pause;
  const auto& queues = Platform::current().queues;
  queues->runAfter(pauseAfter(entry.submission.attempts), queues->mainQueue(),
                   [weak = weak_from_this(), identifier = entry.submission.identifier, pause = entry.pause] {
                     if (const auto self = weak.lock()) {
                       self->endPause(identifier, pause);
                     }
                   });
}

void LMRSubmissionQueue::endPause(const std::string& identifier, std::uint64_t pause) {
  Entry* const entry = find(identifier);
  if (entry && entry->isPausing && entry->pause == pause) {
    entry->isPausing = false;
    proceed();
  }
}

void LMRSubmissionQueue::postChange() {
  Platform::current().notificationCenter->post(LMRSubmissionQueueDidChangeNotification, shared_from_this());
}
