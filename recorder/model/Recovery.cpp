#include "recorder/model/Recovery.h"

#include "recorder/model/Texts.h"

#include <algorithm>
#include <utility>

namespace recorder {

LMRErrorRef Recovery::open() {
  LMRErrorRef error;
  journal_ = LMRRecordingJournal::journalWithError(&error);
  return error;
}

LMRErrorRef Recovery::note(const Take& take, const Episode& episode) {
  if (!journal_) {
    return LMRError::make(LMRRecordingJournalErrorDomain, 1, text("The reason is not known"));
  }
  auto note = LMRRecordingNote::noteWithRecorder(take.recorder());
  note.userMetadata = episode.userMetadata();
  for (LMRNotedSource& source : note.sources) {
    source.name = source.isLocal() ? take.nameOf(source.file) : source.name;
  }
  LMRErrorRef error = journal_->open(note);
  if (!error) {
    note_ = std::move(note);
  }
  return error;
}

void Recovery::noteEnd(const Take& take, const Episode& episode) {
  if (note_) {
    note_->takeSourcesOf(take.recorder());
    note_->userMetadata = episode.userMetadata();
    journal_->update(*note_);
  }
}

void Recovery::close() {
  if (note_) {
    journal_->close(note_->identifier);
    note_.reset();
  }
}

void Recovery::find(const std::shared_ptr<LMRSession>& session) {
  if (!journal_) {
    return;
  }
  lumora::Platform::current().queues->concurrentQueue()->async([weak = weak_from_this(), journal = journal_, session] {
    lumora::Platform::current().queues->mainQueue()->async(
        [weak, session, found = LMRUnfinishedRecording::unfinishedRecordingsInJournal(journal)] {
          if (const auto self = weak.lock()) {
            self->take(found, *session);
          }
        });
  });
}

// Those of others wait for them; what is of no use is forgotten.
void Recovery::take(const Recordings& found, const LMRSession& session) {
  for (const auto& recording : found) {
    if (!recording->isUsable()) {
      recording->keep();
    } else if (recording->note().isFor(session)) {
      found_.push_back(recording);
    }
  }
  changed.notify();
}

std::shared_ptr<LMRUnfinishedRecording> Recovery::found() const {
  return found_.empty() ? nullptr : found_.front();
}

void Recovery::submit(const std::shared_ptr<LMRSession>& session, const std::shared_ptr<Submissions>& submissions) {
  isBusy_ = true;
  lumora::Platform::current().queues->concurrentQueue()->async(
      [self = shared_from_this(), recording = found(), session, submissions] {
        recording->repair();
        LMRErrorRef error = recording->prepareSubmissionWithSession(session);
        lumora::Platform::current().queues->mainQueue()->async([self, recording, session, submissions, error] {
          self->done(error ? error : submissions->addUnfinished(*recording, *session));
        });
      });
  changed.notify();
}

void Recovery::keep() {
  done(found()->keep());
}

void Recovery::discard() {
  done(found()->discard());
}

void Recovery::later() {
  done(nullptr);
}

// Also after an error: the next run finds it again.
void Recovery::done(LMRErrorRef error) {
  isBusy_ = false;
  error_ = std::move(error);
  found_.erase(found_.begin());
  changed.notify();
}

} // namespace recorder
