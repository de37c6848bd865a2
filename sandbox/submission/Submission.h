#pragma once

#include "../store/Episodes.h"
#include "../store/Users.h"

#include <functional>
#include <utility>

namespace lumora::sandbox {

/// What is to be filed, checked as far as it can be without touching the files.
struct Submission {
  /// Without UUID, time and files.
  Episode episode;
  std::vector<std::filesystem::path> sources;
  /// Remove the sources once they are filed.
  bool removesSources = false;
  /// What the server has itself and files like a source: name and content.
  std::optional<std::pair<std::string, std::string>> material = std::nullopt;
  /// Done in the change of the store that files the episode; it may refuse.
  std::function<void()> alongside = nullptr;
};

/// What a caller names.
struct SubmissionRequest {
  std::vector<std::string> files;
  std::string metadataPath;
  std::optional<std::string> recordingMetadataPath;
  /// By name or UUID; else the place in a recording container.
  std::optional<std::string> workflow;
  std::optional<std::string> submissionUUID;
};

/// Reads the metadata, finds the workflow or the place, and looks at the files; refuses what cannot be filed.
Submission prepare(Store& store, const SubmissionRequest& request, const User& user);

/// What came of a submission.
struct Filed {
  std::string episodeUUID;
  /// Sources that were to be removed and could not be.
  std::vector<std::string> remaining;
};

/// Copies the files and records the episode: all of it or nothing.
Filed fileNow(Store& store, Submission submission);

/// Lists an upload, and leaves the rest to a process of its own. The episode's UUID.
std::string fileInBackground(Store& store, Submission submission);

} // namespace lumora::sandbox
