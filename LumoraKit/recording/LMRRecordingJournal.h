#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/recording/LMRRecordingNote.h>

#include <filesystem>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// Domain of the journal's own errors, and of those of LMRUnfinishedRecording; the code is 1.
inline constexpr std::string_view LMRRecordingJournalErrorDomain = "org.vantor.lumora.recordingjournal";

/// Notes on disk what is being recorded, so that it is found again when the application dies before it has handed the
/// files on.
///
///     auto journal = LMRRecordingJournal::journalWithError(&error);
///     recorder->bootstrap();                                          // now the files have names
///     auto note = LMRRecordingNote::noteWithRecorder(recorder);
///     error = journal->open(note);
///     recorder->start();
///     ...
///     recorder->stop();
///     ...                                                             // recorderDidStopRecording:
///     note.takeSourcesOf(recorder);
///     error = journal->update(note);                                  // the submission UUIDs
///     ...                                                             // each file is added to an LMRSubmissionQueue
///     error = journal->close(note.identifier);
///
/// A note is open while this journal has it: no other journal, in whichever process, is given it. When the process
/// ends, however it does, the notes that it has not closed are unfinished recordings, for the next journal of the
/// folder; see LMRUnfinishedRecording. What was written is on the disk when a call returns.
///
/// Any thread. Changes write a small file and wait for the disk.
class LUMORA_EXPORT LMRRecordingJournal {
  // Makes the constructor callable by the factory only.
  struct MadeByFactory {
    explicit MadeByFactory() = default;
  };

public:
  /// The journal in the folder "Recordings" in LMRApplicationSupportDirectory().
  static std::shared_ptr<LMRRecordingJournal> journalWithError(LMRErrorRef* error);
  /// The journal that is kept in a folder, which is made when it is missing; several journals may share it. Null, with
  /// the error set, when it cannot be made.
  /// \param error may be null
  static std::shared_ptr<LMRRecordingJournal> journalWithFolder_error(const std::filesystem::path& folder,
                                                                      LMRErrorRef* error);

  LMRRecordingJournal(MadeByFactory key, std::filesystem::path folder);
  LMRRecordingJournal(const LMRRecordingJournal&) = delete;
  LMRRecordingJournal& operator=(const LMRRecordingJournal&) = delete;
  /// The notes that are open become unfinished recordings.
  ~LMRRecordingJournal();

  /// Writes a new note, and gives it its identifier. Null on success; after an error there is no note.
  LMRErrorRef open(LMRRecordingNote& note);
  /// Writes an open note anew. Null on success; after an error the note is as it was.
  LMRErrorRef update(const LMRRecordingNote& note);
  /// Forgets an open note, after its files were handed on, or deleted. Null on success. The files are left alone.
  LMRErrorRef close(const std::string& identifier);

  /// The notes of journals that have ended, oldest first; they are open in this journal from now on. A note that cannot
  /// be read is left alone and logged.
  std::vector<LMRRecordingNote> takeUnfinished();

private:
  std::filesystem::path noteFile(const std::string& identifier) const;
  std::filesystem::path lockFile(const std::string& identifier) const;
  LMRErrorRef write(const LMRRecordingNote& note) const;
  std::optional<LMRRecordingNote> read(const std::filesystem::path& file, bool& isGone) const;
  std::optional<LMRRecordingNote> take(const std::filesystem::path& file);
  bool isOpen(const std::string& identifier) const;

  const std::filesystem::path folder_;
  mutable std::mutex mutex_;
  // The lock of each open note.
  std::map<std::string, std::shared_ptr<void>> open_;
};
