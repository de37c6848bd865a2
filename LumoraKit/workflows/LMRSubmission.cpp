#include <LumoraKit/workflows/LMRSubmission.h>

#include <limits>

namespace {

constexpr std::string_view identifierKey = "identifier";
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

// False when there is no such value.
bool read(const lumora::Dictionary& dictionary, std::string_view key, std::string& text) {
  const auto found = dictionary.string(key);
  text = found.value_or("");
  return found.has_value();
}

bool read(const lumora::Dictionary& dictionary, std::string_view key, lumora::Dictionary& entries) {
  const lumora::Dictionary* const found = dictionary.dictionary(key);
  entries = found ? *found : lumora::Dictionary();
  return found != nullptr;
}

bool read(const lumora::Dictionary& dictionary, std::string_view key, bool& flag) {
  const lumora::Value* const value = dictionary.find(key);
  const auto found = value ? value->boolean() : std::nullopt;
  flag = found.value_or(false);
  return found.has_value();
}

template <class Number> bool readNumber(const lumora::Dictionary& dictionary, std::string_view key, Number& number) {
  const lumora::Value* const value = dictionary.find(key);
  const auto found = value ? value->unsignedInteger() : std::nullopt;
  if (!found || *found > std::numeric_limits<Number>::max()) {
    return false;
  }
  number = static_cast<Number>(*found);
  return true;
}

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
  if (lastError) {
    dictionary.set(lastErrorKey, *lastError);
  }
  return dictionary;
}

std::optional<LMRSubmission> LMRSubmission::submissionWithDictionary(const lumora::Dictionary& dictionary) {
  LMRSubmission submission;
  std::string file;
  bool isHeld = false;
  const bool isComplete =
      read(dictionary, identifierKey, submission.identifier) && read(dictionary, fileKey, file) &&
      read(dictionary, submissionUUIDKey, submission.submissionUUID) &&
      read(dictionary, userMetadataKey, submission.userMetadata) &&
      read(dictionary, recordingMetadataKey, submission.recordingMetadata) &&
      read(dictionary, deleteKey, submission.deleteAfterSubmission) && read(dictionary, serverKey, submission.server) &&
      readNumber(dictionary, portKey, submission.port) && read(dictionary, userNameKey, submission.userName) &&
      read(dictionary, heldKey, isHeld) && readNumber(dictionary, attemptsKey, submission.attempts);
  if (!isComplete) {
    return std::nullopt;
  }
  submission.file = file;
  submission.state = isHeld ? State::Held : State::Waiting;
  submission.lastError = dictionary.string(lastErrorKey);
  return submission;
}
