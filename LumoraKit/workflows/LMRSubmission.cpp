#include <LumoraKit/platform/ReadEntry.h>
#include <LumoraKit/workflows/LMRSubmission.h>

namespace {

constexpr std::string_view identifierKey = "identifier";
constexpr std::string_view nameKey = "name";
constexpr std::string_view fileKey = "file";
constexpr std::string_view submissionUUIDKey = "submission_uuid";
constexpr std::string_view userMetadataKey = "user_metadata";
constexpr std::string_view recordingMetadataKey = "recording_metadata";
constexpr std::string_view deleteKey = "delete_after_submission";
constexpr std::string_view serverKey = "server";
constexpr std::string_view portKey = "port";
constexpr std::string_view userNameKey = "user";
constexpr std::string_view heldKey = "held";
constexpr std::string_view attemptsKey = "attempts";
constexpr std::string_view lastErrorKey = "last_error";

} // namespace

bool LMRSubmission::isFor(const LMRSession& session) const {
  return session.server() == server && session.port() == port && session.userName().value_or("") == userName;
}

lumora::Dictionary LMRSubmission::dictionaryRepresentation() const {
  lumora::Dictionary dictionary{{std::string(identifierKey), identifier},
                                {std::string(fileKey), file.string()},
                                {std::string(submissionUUIDKey), submissionUUID},
                                {std::string(userMetadataKey), userMetadata},
                                {std::string(recordingMetadataKey), recordingMetadata},
                                {std::string(deleteKey), deleteAfterSubmission},
                                {std::string(serverKey), server},
                                {std::string(portKey), unsigned{port}},
                                {std::string(userNameKey), userName},
                                {std::string(heldKey), state == State::Held},
                                {std::string(attemptsKey), attempts}};
  if (!name.empty()) {
    dictionary.set(nameKey, name);
  }
  if (lastError) {
    dictionary.set(lastErrorKey, *lastError);
  }
  return dictionary;
}

std::optional<LMRSubmission> LMRSubmission::submissionWithDictionary(const lumora::Dictionary& dictionary) {
  using lumora::readEntry;
  LMRSubmission submission;
  std::string file;
  bool isHeld = false;
  const bool isComplete =
      readEntry(dictionary, identifierKey, submission.identifier) && readEntry(dictionary, fileKey, file) &&
      readEntry(dictionary, submissionUUIDKey, submission.submissionUUID) &&
      readEntry(dictionary, userMetadataKey, submission.userMetadata) &&
      readEntry(dictionary, recordingMetadataKey, submission.recordingMetadata) &&
      readEntry(dictionary, deleteKey, submission.deleteAfterSubmission) &&
      readEntry(dictionary, serverKey, submission.server) && readEntry(dictionary, portKey, submission.port) &&
      readEntry(dictionary, userNameKey, submission.userName) && readEntry(dictionary, heldKey, isHeld) &&
      readEntry(dictionary, attemptsKey, submission.attempts);
  if (!isComplete) {
    return std::nullopt;
  }
  submission.name = dictionary.string(nameKey).value_or("");
  submission.file = file;
  submission.state = isHeld ? State::Held : State::Waiting;
  submission.lastError = dictionary.string(lastErrorKey);
  return submission;
}
