#pragma once

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/Value.h>

#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <vector>

class LMRSourceRecorder;

/// One source of a recording that was noted.
struct LUMORA_EXPORT LMRNotedSource {
  /// The class name of its recorder: "LMRLocalScreenRecorder".
  std::string recorder;
  /// The server's name for a remote camera; whatever the application likes for a local source.
  std::string name;
  /// Absolute; empty for a remote source.
  std::filesystem::path file;
  /// Empty until the recording is stopped.
  std::string submissionUUID;

  /// Whether its file is on this machine.
  bool isLocal() const { return !file.empty(); }
};

/// What must be known of a recording to go on with it after the application has died. A value; LMRRecordingJournal
/// keeps it.
struct LUMORA_EXPORT LMRRecordingNote {
  /// Given by the journal: a UUID.
  std::string identifier;
  /// When it was noted.
  lumora::Date began;

  /// What it is recorded for; empty when that is not known yet.
  std::string workflowUUID;
  /// For the viewers; LMREpisodeUserMetadata...Key.
  lumora::Dictionary userMetadata;

  // Whose session it needs: server, port and user as in the session, the server empty when nobody has logged in.
  // Passwords are not kept.

  /// The host name of the server.
  std::string server;
  /// The port of the server; 0 is the default port.
  std::uint16_t port = LMRDefaultServerPort;
  /// Empty with single sign-on.
  std::string userName;

  /// In the order in which they get a submission UUID.
  std::vector<LMRNotedSource> sources;

  /// Notes a recorder of one source or of several, with the files of its local sources (it was bootstrapped), the
  /// submission UUIDs so far, and what a recorder of several sources knows of workflow, session and metadata. It begins
  /// now. Any thread.
  static LMRRecordingNote noteWithRecorder(const std::shared_ptr<LMRSourceRecorder>& recorder);
  /// Takes the sources once more: the submission UUIDs are known when the recorder reports its stop.
  void takeSourcesOf(const std::shared_ptr<LMRSourceRecorder>& recorder);

  /// Whose session is needed to submit it.
  void setSession(const LMRSession& session);
  /// Whether that session may submit it.
  bool isFor(const LMRSession& session) const;
  /// Whether every local source has its submission UUID.
  bool hasSubmissionUUIDs() const;

  /// As it is kept on disk.
  lumora::Dictionary dictionaryRepresentation() const;
  /// Nothing when something is missing or of a wrong type.
  static std::optional<LMRRecordingNote> noteWithDictionary(const lumora::Dictionary& dictionary);
};
