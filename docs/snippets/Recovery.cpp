// The examples about recordings that a crash has left unfinished.

#include <LumoraKit/LumoraKit.h>

#include <filesystem>
#include <memory>
#include <string>

namespace snippets {

class Window {
public:
  void show(const LMRRecordingNote& note);
  void show(const std::vector<LMRMovieFile>& movies);
};

LMRErrorRef keepAJournal(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  LMRErrorRef error;
  auto journal = LMRRecordingJournal::journalWithError(&error); // one for the application
  recorder->bootstrap();                                        // now the files have names
  auto note = LMRRecordingNote::noteWithRecorder(recorder);
  error = journal->open(note); // on the disk from now on
  recorder->start();
  // Recording.
  recorder->stop();
  // recorderDidStopRecording:
  note.takeSourcesOf(recorder);
  error = journal->update(note); // the submission UUIDs as well
  // Each file is added to the submission queue.
  error = journal->close(note.identifier); // also after a cancel
  return error;
}

LMRErrorRef finishWhatACrashHasLeft(const std::shared_ptr<LMRRecordingJournal>& journal,
                                    const std::shared_ptr<LMRSession>& session,
                                    const std::shared_ptr<LMRSubmissionQueue>& queue, Window* window) {
  LMRErrorRef error;
  for (const auto& recording : LMRUnfinishedRecording::unfinishedRecordingsInJournal(journal)) {
    window->show(recording->note());
    window->show(recording->movies());
    error = recording->repair();
    error = recording->prepareSubmissionWithSession(session); // one server command, if it was not stopped
    error = recording->submitToQueue_session_deleteAfterSubmission(*queue, *session, false);
  } // or keep(), or discard()
  return error;
}

// LMRMovieFile.h
void look(const std::filesystem::path& file) {
  auto movie = LMRMovieFile::movieFileWithPath(file);
  if (movie.state == LMRMovieFile::State::Torn) {
    LMRErrorRef error = movie.repair();
  }
}

} // namespace snippets
