#include "Episodes.h"

#include <LumoraKit/platform/PropertyList.h>

namespace lumora::sandbox {

namespace {

std::optional<std::string> textOf(const std::optional<Dictionary>& dictionary) {
  return dictionary ? std::optional(xmlDescription(*dictionary).value()) : std::nullopt;
}

Episode episodeFrom(SQLite::Statement& row) {
  Episode episode;
  episode.uuid = row.getColumn(0).getString();
  episode.slotUUID = optionalText(row.getColumn(1));
  episode.workflowUUID = row.getColumn(2).getString();
  episode.workflowName = row.getColumn(3).getString();
  episode.user = row.getColumn(4).getString();
  episode.submitted = row.getColumn(5).getInt64();
  episode.userMetadata = dictionaryWithXMLDescription(row.getColumn(6).getString()).value();
  if (const auto text = optionalText(row.getColumn(7))) {
    episode.recordingMetadata = dictionaryWithXMLDescription(*text).value();
  }
  return episode;
}

std::vector<StoredFile> filesOf(Store& store, const std::string& episodeUUID) {
  std::vector<StoredFile> files;
  auto row = store.query("SELECT name, stored_name, size, sha256 FROM files WHERE episode_uuid = ? ORDER BY position",
                         episodeUUID);
  while (row.executeStep()) {
    files.push_back({row.getColumn(0).getString(), row.getColumn(1).getString(), row.getColumn(2).getInt64(),
                     row.getColumn(3).getString()});
  }
  return files;
}

} // namespace

void insertEpisode(Store& store, const Episode& episode) {
  store.execute("INSERT INTO episodes VALUES (?, ?, ?, ?, ?, ?, ?, ?)", episode.uuid, episode.slotUUID,
                episode.workflowUUID, episode.workflowName, episode.user, episode.submitted,
                xmlDescription(episode.userMetadata).value(), textOf(episode.recordingMetadata));
  std::int64_t position = 0;
  for (const auto& file : episode.files) {
    store.execute("INSERT INTO files VALUES (?, ?, ?, ?, ?, ?)", episode.uuid, position++, file.name, file.storedName,
                  file.size, file.sha256);
  }
}

bool episodeExists(Store& store, const std::string& uuid) {
  return store.query("SELECT 1 FROM episodes WHERE uuid = ?", uuid).executeStep();
}

std::vector<Episode> episodes(Store& store) {
  std::vector<Episode> all;
  auto row = store.query("SELECT uuid, slot_uuid, workflow_uuid, workflow_name, user, submitted, user_metadata, "
                         "recording_metadata FROM episodes ORDER BY rowid");
  while (row.executeStep()) {
    all.push_back(episodeFrom(row));
    all.back().files = filesOf(store, all.back().uuid);
  }
  return all;
}

std::filesystem::path folderOf(const Store& store, const std::string& episodeUUID) {
  return store.submissionsFolder() / episodeUUID;
}

} // namespace lumora::sandbox
