#pragma once

#include "Store.h"

#include <LumoraKit/platform/Value.h>

#include <vector>

namespace lumora::sandbox {

/// One file of an episode.
struct StoredFile {
  /// As the submitter named it.
  std::string name;
  /// Within the episode's folder.
  std::string storedName;
  std::int64_t size = 0;
  /// In lower-case hexadecimal digits.
  std::string sha256;
};

/// What was submitted at one go: the files and their metadata.
struct Episode {
  std::string uuid;
  /// The place in a recording container it was filed into.
  std::optional<std::string> slotUUID;
  std::string workflowUUID;
  std::string workflowName;
  std::string user;
  std::int64_t submitted = 0;
  Dictionary userMetadata;
  std::optional<Dictionary> recordingMetadata;
  std::vector<StoredFile> files;
};

/// To be called within a change of the store.
void insertEpisode(Store& store, const Episode& episode);
bool episodeExists(Store& store, const std::string& uuid);
/// In the order of their submission.
std::vector<Episode> episodes(Store& store);
/// Where the files of an episode lie.
std::filesystem::path folderOf(const Store& store, const std::string& episodeUUID);

} // namespace lumora::sandbox
