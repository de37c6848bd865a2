#pragma once

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/Value.h>

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>

/// One recorded file on its way into a submission of a server, with everything that is needed to file it. A value
/// without a behaviour of its own; see LMRSubmissionQueue.
struct LUMORA_EXPORT LMRSubmission {
  /// What a submission waits for.
  enum class State {
    /// For its turn, for a session, or for the end of the pause after a failure.
    Waiting,
    Submitting,
    /// The server will not take it, or the file is gone: it is not tried again by itself. The reason is in lastError.
    Held,
  };

  /// Given by the queue: a UUID.
  std::string identifier;

  /// For a list of the application's, beside the title: which part of an episode it is, a camera's name for instance.
  /// Kept, and not sent.
  std::string name;

  // What is submitted.

  /// Absolute.
  std::filesystem::path file;
  /// One of LMRSubmissionUUIDSKey, as the recorders get them when they are stopped. A server files each once only.
  std::string submissionUUID;
  /// For the viewers; LMREpisodeUserMetadata...Key.
  lumora::Dictionary userMetadata;
  /// About the recording; LMREpisodeRecordingMetadata...Key. Not sent when empty.
  lumora::Dictionary recordingMetadata;
  /// Whether the file is removed once the server has it.
  bool deleteAfterSubmission = false;

  // Whose session it needs: server, port and user as in the session. Passwords are not kept.

  /// The host name of the server.
  std::string server;
  /// The port of the server; 0 is the default port.
  std::uint16_t port = LMRDefaultServerPort;
  /// Empty with single sign-on.
  std::string userName;

  // How far it is.

  /// What it waits for now.
  State state = State::Waiting;
  /// How often it was tried, the try under way included.
  std::uint32_t attempts = 0;
  /// What the last try failed with, for the user.
  std::optional<std::string> lastError;

  /// Whether that session may file it.
  bool isFor(const LMRSession& session) const;

  /// As it is kept on disk. Submitting is kept as Waiting.
  lumora::Dictionary dictionaryRepresentation() const;
  /// Nothing when something is missing or of a wrong type.
  static std::optional<LMRSubmission> submissionWithDictionary(const lumora::Dictionary& dictionary);
};
