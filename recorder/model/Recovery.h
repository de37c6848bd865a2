#pragma once

#include "recorder/model/Submissions.h"
#include "recorder/model/Take.h"

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <optional>
#include <vector>

namespace recorder {

/// Notes each take on the disk while it is under way, and finds those that an earlier run has left behind. Main thread
/// only.
class Recovery : public std::enable_shared_from_this<Recovery> {
public:
  /// Told when something was found or done.
  lumora::Notifier changed;

  /// An error when takes cannot be noted.
  LMRErrorRef open();

  /// A take that is about to start, with what its viewers are told.
  LMRErrorRef note(const Take& take, const Episode& episode);
  /// The take has stopped: its places at the server are known.
  void noteEnd(const Take& take, const Episode& episode);
  /// The files of the take were handed on, or deleted.
  void close();
  /// The files of the take stay, and are found by the next run.
  void leave() { note_.reset(); }

  /// Looks on a worker for what that user can submit.
  void find(const std::shared_ptr<LMRSession>& session);
  /// The oldest that is left behind and may be of use; null when there is none.
  std::shared_ptr<LMRUnfinishedRecording> found() const;
  bool isBusy() const { return isBusy_; }
  /// Why it could not be submitted or discarded; null when nothing went wrong.
  const LMRErrorRef& error() const { return error_; }

  /// What becomes of the one that was found. Repairs it on a worker and hands it to the queue.
  void submit(const std::shared_ptr<LMRSession>& session, const std::shared_ptr<Submissions>& submissions);
  /// Forgets it; the files stay.
  void keep();
  void discard();
  /// The next run finds it again.
  void later();

private:
  using Recordings = std::vector<std::shared_ptr<LMRUnfinishedRecording>>;

  void take(const Recordings& found, const LMRSession& session);
  void done(LMRErrorRef error);

  std::shared_ptr<LMRRecordingJournal> journal_;
  std::optional<LMRRecordingNote> note_;
  Recordings found_;
  bool isBusy_ = false;
  LMRErrorRef error_;
};

} // namespace recorder
