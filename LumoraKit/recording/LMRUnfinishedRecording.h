#pragma once

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/recording/LMRMovieFile.h>
#include <LumoraKit/recording/LMRRecordingJournal.h>
#include <LumoraKit/recording/LMRRecordingNote.h>
#include <LumoraKit/workflows/LMRSubmission.h>

#include <memory>
#include <vector>

class LMRSubmissionQueue;

/// A recording that an application has left behind when it died: what there is of it, and what can become of it.
///
///     for (const auto& recording : LMRUnfinishedRecording::unfinishedRecordingsInJournal(journal)) {   // on a worker
///       ...                                                       // show note() and movies(), ask the user
///       error = recording->repair();                                // on a worker
///       error = recording->prepareSubmissionWithSession(session);   // on a worker: one server command
///       error = recording->submitToQueue_session_deleteAfterSubmission(*queue, *session, false);   // main
///     }                                                             // or keep(), or discard()
///
/// One that is left as it is, is found again when the journal has ended. One thread at a time, whichever it is, except
/// where an operation says otherwise.
class LUMORA_EXPORT LMRUnfinishedRecording {
  // Makes the constructor callable by the factory only.
  struct MadeByFactory {
    explicit MadeByFactory() = default;
  };

public:
  /// What the journal takes, oldest first. Blocks: every file is looked at.
  static std::vector<std::shared_ptr<LMRUnfinishedRecording>>
  unfinishedRecordingsInJournal(const std::shared_ptr<LMRRecordingJournal>& journal);

  LMRUnfinishedRecording(MadeByFactory key, std::shared_ptr<LMRRecordingJournal> journal, LMRRecordingNote note);
  LMRUnfinishedRecording(const LMRUnfinishedRecording&) = delete;
  LMRUnfinishedRecording& operator=(const LMRUnfinishedRecording&) = delete;
  ~LMRUnfinishedRecording();

  /// What was noted.
  const LMRRecordingNote& note() const { return note_; }
  /// Writes what has become known: another title, a workflow, a session. Identifier and sources stay as they are. Null
  /// on success; after an error the note is as it was.
  LMRErrorRef setNote(LMRRecordingNote note);
  /// The files of the local sources, in their order in the note.
  const std::vector<LMRMovieFile>& movies() const { return movies_; }
  /// Whether a movie is there that could be submitted, after a repair or as it is.
  bool isUsable() const;

  /// Repairs every torn movie; unusable and missing ones are left as they are. Null on success; the first error
  /// otherwise, after all were tried. Blocks for the disk.
  LMRErrorRef repair();

  /// Gets the submission UUIDs of a recording that was not stopped: makes a container for it on the server and notes
  /// them. Without effect when they are known. Needs the workflow and the session of the note. Blocks for one server
  /// command.
  /// \return null on success; else the server's error, or the journal's
  LMRErrorRef prepareSubmissionWithSession(const std::shared_ptr<LMRSession>& session);
  /// What there is to submit: one entry a playable movie whose submission UUID is known, with the source's name, the
  /// note's metadata, the moments of begin and end, and the duration.
  std::vector<LMRSubmission> submissions() const;
  /// Adds them to the queue, those aside that it has already, and closes the note. The files of remote sources are the
  /// server's; unusable movies stay where they are. Null on success; after an error, also when there is nothing to
  /// submit or a movie is still torn, the note stays, and nothing is filed twice when it is tried again. Main thread
  /// only.
  /// \param deleteAfterSubmission whether each file is removed once the server has it
  LMRErrorRef submitToQueue_session_deleteAfterSubmission(LMRSubmissionQueue& queue, const LMRSession& session,
                                                          bool deleteAfterSubmission);

  /// Forgets the recording; its files stay where they are. Null on success.
  LMRErrorRef keep();
  /// Deletes the files of its local sources, whatever they are, and forgets the recording. Null on success; after an
  /// error the note stays.
  LMRErrorRef discard();

private:
  LMRErrorRef takeSubmissionUUIDs(const lumora::Array* uuids);

  const std::shared_ptr<LMRRecordingJournal> journal_;
  LMRRecordingNote note_;
  std::vector<LMRMovieFile> movies_;
};
