#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/ReadEntry.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/recording/LMRRecordingNote.h>
#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

#include <algorithm>
#include <chrono>
#include <string_view>
#include <utility>

namespace {

constexpr std::string_view identifierKey = "identifier";
constexpr std::string_view beganKey = "began";
constexpr std::string_view workflowKey = "workflow_uuid";
constexpr std::string_view userMetadataKey = "user_metadata";
constexpr std::string_view serverKey = "server";
constexpr std::string_view portKey = "port";
constexpr std::string_view userNameKey = "user";
constexpr std::string_view sourcesKey = "sources";
constexpr std::string_view recorderKey = "recorder";
constexpr std::string_view nameKey = "name";
constexpr std::string_view fileKey = "file";
constexpr std::string_view submissionUUIDKey = "submission_uuid";

using Recorder = std::shared_ptr<LMRSourceRecorder>;

std::vector<Recorder> inSubmissionOrder(const LMRMultipleSourceRecorder& recorder) {
  const auto sources = recorder.sourceRecorders();
  std::vector<Recorder> ordered;
  for (const std::size_t index : recorder.sourceRecorderSubmissionOrder()) {
    if (index < sources.size()) {
      ordered.push_back(sources[index]);
    }
  }
  return ordered;
}

LMRNotedSource notedSource(const Recorder& recorder) {
  LMRNotedSource source;
  source.recorder = recorder->className();
  const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(recorder);
  const auto remote = std::dynamic_pointer_cast<LMRRemoteVideoRecorder>(recorder);
  if (local) {
    source.file = local->outputFileURL().value_or("");
    source.submissionUUID = local->submissionUUID().value_or("");
  } else if (remote) {
    source.name = remote->remoteRecorderName().value_or("");
    source.submissionUUID = remote->submissionUUID().value_or("");
  }
  return source;
}

lumora::Value valueOf(const LMRNotedSource& source) {
  return lumora::Dictionary{{std::string(recorderKey), source.recorder},
                            {std::string(nameKey), source.name},
                            {std::string(fileKey), source.file.string()},
                            {std::string(submissionUUIDKey), source.submissionUUID}};
}

bool readSource(const lumora::Value& value, LMRNotedSource& source) {
  using lumora::readEntry;
  const lumora::Dictionary* const entries = value.dictionary();
  std::string file;
  if (!entries || !readEntry(*entries, recorderKey, source.recorder) || !readEntry(*entries, nameKey, source.name) ||
      !readEntry(*entries, fileKey, file) || !readEntry(*entries, submissionUUIDKey, source.submissionUUID)) {
    return false;
  }
  source.file = file;
  return !source.isLocal() || source.file.is_absolute();
}

bool readSources(const lumora::Dictionary& dictionary, std::vector<LMRNotedSource>& sources) {
  const lumora::Array* const listed = dictionary.array(sourcesKey);
  return listed && std::ranges::all_of(*listed, [&sources](const lumora::Value& value) {
           return readSource(value, sources.emplace_back());
         });
}

} // namespace

LMRRecordingNote LMRRecordingNote::noteWithRecorder(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  LMRRecordingNote note;
  note.began = std::chrono::floor<std::chrono::seconds>(lumora::Platform::current().wallClock->now());
  note.takeSourcesOf(recorder);
  if (const auto combined = std::dynamic_pointer_cast<LMRMultipleSourceRecorder>(recorder)) {
    note.workflowUUID = combined->workflowUUID().value_or("");
    note.userMetadata = combined->metadata().value_or(lumora::Dictionary());
    if (const auto session = combined->session()) {
      note.setSession(*session);
    }
  }
  return note;
}

// The names that the application has given to local sources stay.
void LMRRecordingNote::takeSourcesOf(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  const auto combined = std::dynamic_pointer_cast<LMRMultipleSourceRecorder>(recorder);
  const auto before = std::exchange(sources, {});
  for (const auto& source : combined ? inSubmissionOrder(*combined) : std::vector{recorder}) {
    LMRNotedSource& noted = sources.emplace_back(notedSource(source));
    const auto same = std::ranges::find_if(
        before, [&](const LMRNotedSource& old) { return noted.isLocal() && old.file == noted.file; });
    noted.name = same == before.end() ? noted.name : same->name;
  }
}

void LMRRecordingNote::setSession(const LMRSession& session) {
  server = session.server().value_or("");
  port = session.port();
  userName = session.userName().value_or("");
}

bool LMRRecordingNote::isFor(const LMRSession& session) const {
  return session.server().value_or("") == server && session.port() == port &&
         session.userName().value_or("") == userName;
}

bool LMRRecordingNote::hasSubmissionUUIDs() const {
  return std::ranges::none_of(
      sources, [](const LMRNotedSource& source) { return source.isLocal() && source.submissionUUID.empty(); });
}

lumora::Dictionary LMRRecordingNote::dictionaryRepresentation() const {
  lumora::Array listed;
  std::ranges::transform(sources, std::back_inserter(listed), valueOf);
  return {{std::string(identifierKey), identifier}, {std::string(beganKey), began},
          {std::string(workflowKey), workflowUUID}, {std::string(userMetadataKey), userMetadata},
          {std::string(serverKey), server},         {std::string(portKey), unsigned{port}},
          {std::string(userNameKey), userName},     {std::string(sourcesKey), std::move(listed)}};
}

std::optional<LMRRecordingNote> LMRRecordingNote::noteWithDictionary(const lumora::Dictionary& dictionary) {
  using lumora::readEntry;
  LMRRecordingNote note;
  const bool isComplete = readEntry(dictionary, identifierKey, note.identifier) &&
                          readEntry(dictionary, beganKey, note.began) &&
                          readEntry(dictionary, workflowKey, note.workflowUUID) &&
                          readEntry(dictionary, userMetadataKey, note.userMetadata) &&
                          readEntry(dictionary, serverKey, note.server) && readEntry(dictionary, portKey, note.port) &&
                          readEntry(dictionary, userNameKey, note.userName) && readSources(dictionary, note.sources);
  return isComplete ? std::optional(std::move(note)) : std::nullopt;
}
