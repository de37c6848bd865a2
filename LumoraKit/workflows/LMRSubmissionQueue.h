#pragma once

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/workflows/LMRSubmission.h>

#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

/// Posted whenever submissions() has become different. The object is the std::shared_ptr<LMRSubmissionQueue>.
inline constexpr std::string_view LMRSubmissionQueueDidChangeNotification = "LMRSubmissionQueueDidChangeNotification";
/// Posted when the server has taken a submission, which has left the queue. The object is the LMRSubmission.
inline constexpr std::string_view LMRSubmissionQueueDidSubmitNotification = "LMRSubmissionQueueDidSubmitNotification";

/// Domain of the queue's own errors; the code is 1.
inline constexpr std::string_view LMRSubmissionQueueErrorDomain = "org.vantor.lumora.submissionqueue";

/// Submits recorded files one after another, and keeps each on disk, with everything it needs, until the server has
/// it: a failed try is repeated after growing pauses and on request, also by the application's next run.
///
///     LMRErrorRef error;
///     auto queue = LMRSubmissionQueue::queueWithError(&error);
///     queue->setSession(session);                                 // after each login
///     ...
///     LMRSubmission submission;                                   // when the recorder has stopped
///     submission.file = *recorder->outputFileURL();
///     submission.submissionUUID = *recorder->submissionUUID();
///     submission.userMetadata = {{std::string(LMREpisodeUserMetadataTitleKey), "Lecture 1"}};
///     error = queue->add(submission, *session);
///
/// What was added is on disk when add() returns, and survives a killed process. A file is never filed twice: a server
/// files a submission UUID once, and when it refuses one with status 34, which may mean that an earlier try has got
/// through, the submission is held for the user to decide.
///
/// Main thread only. Changes write a small file and wait for the disk.
class LUMORA_EXPORT LMRSubmissionQueue : public std::enable_shared_from_this<LMRSubmissionQueue> {
  // Makes the constructor callable by the factory only.
  struct MadeByFactory {
    explicit MadeByFactory() = default;
  };

public:
  /// The queue in the folder "Submissions" in LMRApplicationSupportDirectory().
  static std::shared_ptr<LMRSubmissionQueue> queueWithError(LMRErrorRef* error);
  /// The queue that is kept in a folder, which is made when it is missing. Null, with the error set, when the folder
  /// cannot be used, or is in use by another queue, in whichever process. A file in it that cannot be read is left
  /// alone and logged.
  /// \param error may be null
  static std::shared_ptr<LMRSubmissionQueue> queueWithFolder_error(const std::filesystem::path& folder,
                                                                   LMRErrorRef* error);

  LMRSubmissionQueue(MadeByFactory key, std::filesystem::path folder, std::shared_ptr<void> lock);
  LMRSubmissionQueue(const LMRSubmissionQueue&) = delete;
  LMRSubmissionQueue& operator=(const LMRSubmissionQueue&) = delete;
  /// A tool that is submitting runs on to its end.
  ~LMRSubmissionQueue();

  /// What is to be submitted yet, oldest first.
  std::vector<LMRSubmission> submissions() const;

  /// Keeps the submission on disk and begins with it when nothing else is being submitted. Null on success; after an
  /// error nothing was added. Its identifier, state and server are set by the queue.
  /// \param session whose server and user it is for
  LMRErrorRef add(LMRSubmission submission, const LMRSession& session);

  /// Who is logged in. Submissions for another server or user wait for theirs. Setting it tries everything that waits
  /// at once, in order.
  std::shared_ptr<LMRSession> session() const { return session_; }
  void setSession(std::shared_ptr<LMRSession> session);

  /// Tries it as soon as its turn comes, without waiting for the end of a pause, also when it is held.
  void retry(const std::string& identifier);
  /// Forgets a submission that is not being submitted; the recorded file stays. Null on success.
  LMRErrorRef remove(const std::string& identifier);

private:
  struct Entry {
    LMRSubmission submission;
    std::uint64_t order = 0;
    bool isPausing = false;
    // Which pause this is: the end of an earlier one has no effect.
    std::uint64_t pause = 0;
  };

  LMRErrorRef load();
  void loadEntry(const std::filesystem::path& file);
  Entry* find(const std::string& identifier);
  Entry* nextEntry();
  std::filesystem::path fileOf(const LMRSubmission& submission) const;
  LMRErrorRef save(const Entry& entry) const;
  LMRErrorRef erase(const std::string& identifier);

  void proceed();
  void begin(Entry& entry);
  void startAction(const LMRSubmission& submission);
  void submittedWithAction(const std::shared_ptr<LMRAction>& action);
  void failedWithAction(const std::shared_ptr<LMRAction>& action);
  Entry* endOfAction(const std::shared_ptr<LMRAction>& action);
  void complete(const LMRSubmission& submission);
  void fail(Entry& entry, const std::string& reason, bool isFinal);
  void pause(Entry& entry);
  void endPause(const std::string& identifier, std::uint64_t pause);
  void postChange();

  const std::filesystem::path folder_;
  const std::shared_ptr<void> lock_;
  std::vector<Entry> entries_;
  std::shared_ptr<LMRSession> session_;
  // What is being submitted; empty when nothing is.
  std::string current_;
  // Of actions that have ended; one that cannot be removed is tried again after the next action.
  std::vector<std::filesystem::path> metadataFiles_;
};
