#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRMetadataKeys.h>
#include <LumoraKit/actions/LMRReplyKeys.h>
#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRUnfinishedRecording.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <algorithm>
#include <chrono>
#include <utility>

using lumora::Platform;

namespace {

LMRErrorRef refusal(const std::string& why) {
  return LMRError::make(LMRRecordingJournalErrorDomain, 1, why);
}

constexpr const char* otherSession = "The recording was made for another server or user";

lumora::Dictionary recordingMetadata(lumora::Date began, double duration) {
  // A damaged file may claim more than a date can take.
  constexpr std::chrono::duration<double> longest = std::chrono::years(1);
  const auto whole =
      std::chrono::round<std::chrono::seconds>(std::min(std::chrono::duration<double>(duration), longest));
  return {{std::string(LMREpisodeRecordingMetadataStartDateKey), began},
          {std::string(LMREpisodeRecordingMetadataStopDateKey), began + whole},
          {std::string(LMREpisodeRecordingMetadataDurationKey), duration}};
}

bool holds(const LMRSubmissionQueue& queue, const std::string& submissionUUID) {
  const auto held = queue.submissions();
  return std::ranges::find(held, submissionUUID, &LMRSubmission::submissionUUID) != held.end();
}

} // namespace

std::vector<std::shared_ptr<LMRUnfinishedRecording>>
LMRUnfinishedRecording::unfinishedRecordingsInJournal(const std::shared_ptr<LMRRecordingJournal>& journal) {
  std::vector<std::shared_ptr<LMRUnfinishedRecording>> recordings;
  for (auto& note : journal->takeUnfinished()) {
    recordings.push_back(std::make_shared<LMRUnfinishedRecording>(MadeByFactory(), journal, std::move(note)));
  }
  return recordings;
}

LMRUnfinishedRecording::LMRUnfinishedRecording(MadeByFactory, std::shared_ptr<LMRRecordingJournal> journal,
                                               LMRRecordingNote note)
    : journal_(std::move(journal)), note_(std::move(note)) {
  for (const LMRNotedSource& source : note_.sources) {
    if (source.isLocal()) {
      movies_.push_back(LMRMovieFile::movieFileWithPath(source.file));
    }
  }
}

LMRUnfinishedRecording::~LMRUnfinishedRecording() = default;

// The identifier and the sources are what was recorded: nobody changes them.
LMRErrorRef LMRUnfinishedRecording::setNote(LMRRecordingNote note) {
  note.identifier = note_.identifier;
  note.sources = note_.sources;
  LMRErrorRef error = journal_->update(note);
  if (!error) {
    note_ = std::move(note);
  }
  return error;
}

bool LMRUnfinishedRecording::isUsable() const {
  return std::ranges::any_of(movies_, [](const LMRMovieFile& movie) { return movie.usableSize > 0; });
}

LMRErrorRef LMRUnfinishedRecording::repair() {
  LMRErrorRef first;
  for (LMRMovieFile& movie : movies_) {
    const LMRErrorRef error = movie.state == LMRMovieFile::State::Torn ? movie.repair() : nullptr;
    first = first ? first : error;
  }
  return first;
}

LMRErrorRef LMRUnfinishedRecording::prepareSubmissionWithSession(const std::shared_ptr<LMRSession>& session) {
  if (note_.hasSubmissionUUIDs()) {
    return nullptr;
  }
  if (note_.workflowUUID.empty() || !note_.isFor(*session)) {
    return refusal(note_.workflowUUID.empty() ? "It is not known which workflow the recording is for" : otherSession);
  }
  const auto action =
      LMRActionFactory::actionToCreateRecordingContainerForWorkflowUUID_session(note_.workflowUUID, session);
  action->runSynchronously();
  if (LMRErrorRef error = action->error()) {
    return error;
  }
  const auto reply = action->result();
  return takeSubmissionUUIDs(reply ? reply->array(LMRSubmissionUUIDSKey) : nullptr);
}

// The server lists one a source of the workflow, in the order of the note.
LMRErrorRef LMRUnfinishedRecording::takeSubmissionUUIDs(const lumora::Array* uuids) {
  LMRRecordingNote note = note_;
  for (std::size_t i = 0; i < note.sources.size(); ++i) {
    const std::string* const uuid = uuids && i < uuids->size() ? (*uuids)[i].string() : nullptr;
    if (!uuid) {
      return refusal("The workflow takes fewer sources than were recorded");
    }
    std::string& known = note.sources[i].submissionUUID;
    known = known.empty() ? *uuid : known;
  }
  LMRErrorRef error = journal_->update(note);
  if (!error) {
    note_ = std::move(note);
  }
  return error;
}

std::vector<LMRSubmission> LMRUnfinishedRecording::submissions() const {
  std::vector<LMRSubmission> submissions;
  auto movie = movies_.begin();
  for (const LMRNotedSource& source : note_.sources) {
    if (!source.isLocal()) {
      continue;
    }
    if (movie->isPlayable() && !source.submissionUUID.empty()) {
      LMRSubmission& submission = submissions.emplace_back();
      submission.name = source.name;
      submission.file = source.file;
      submission.submissionUUID = source.submissionUUID;
      submission.userMetadata = note_.userMetadata;
      submission.recordingMetadata = recordingMetadata(note_.began, movie->duration);
    }
    ++movie;
  }
  return submissions;
}

LMRErrorRef LMRUnfinishedRecording::submitToQueue_session_deleteAfterSubmission(LMRSubmissionQueue& queue,
                                                                                const LMRSession& session,
                                                                                bool deleteAfterSubmission) {
  const auto isTorn = [](const LMRMovieFile& movie) { return movie.state == LMRMovieFile::State::Torn; };
  const auto listed = submissions();
  if (std::ranges::any_of(movies_, isTorn) || listed.empty() || !note_.hasSubmissionUUIDs()) {
    return refusal("The recording is not ready to be submitted");
  }
  if (!note_.isFor(session)) {
    return refusal(otherSession);
  }
  for (LMRSubmission submission : listed) {
    submission.deleteAfterSubmission = deleteAfterSubmission;
    LMRErrorRef error = holds(queue, submission.submissionUUID) ? nullptr : queue.add(std::move(submission), session);
    if (error) {
      return error;
    }
  }
  return keep();
}

LMRErrorRef LMRUnfinishedRecording::keep() {
  return journal_->close(note_.identifier);
}

LMRErrorRef LMRUnfinishedRecording::discard() {
  const auto& files = Platform::current().files;
  for (const LMRMovieFile& movie : movies_) {
    LMRErrorRef error = files->isFile(movie.file) ? files->removeFile(movie.file) : nullptr;
    if (error) {
      return error;
    }
  }
  return keep();
}
