#include "Uploads.h"

namespace lumora::sandbox {

namespace {

Upload uploadFrom(SQLite::Statement& row) {
  return {row.getColumn(0).getString(),    row.getColumn(1).getString(),   row.getColumn(2).getString(),
          row.getColumn(3).getString(),    row.getColumn(4).getInt64(),    row.getColumn(5).getInt64(),
          row.getColumn(6).getString(),    optionalText(row.getColumn(7)), row.getColumn(8).getInt64(),
          optionalNumber(row.getColumn(9))};
}

} // namespace

void insertUpload(Store& store, const Upload& upload) {
  store.execute("INSERT INTO uploads (uuid, title, workflow_name, user, file_count, size, state, started) "
                "VALUES (?, ?, ?, ?, ?, ?, ?, ?)",
                upload.uuid, upload.title, upload.workflowName, upload.user, upload.fileCount, upload.size,
                upload.state, upload.started);
}

void completeUpload(Store& store, const std::string& uuid) {
  store.execute("UPDATE uploads SET state = 'completed', ended = ? WHERE uuid = ? AND ended IS NULL", currentTime(),
                uuid);
}

void failUpload(Store& store, const std::string& uuid, const std::string& message) {
  store.execute("UPDATE uploads SET state = 'failed', message = ?, ended = ? WHERE uuid = ? AND ended IS NULL", message,
                currentTime(), uuid);
}

std::vector<Upload> uploads(Store& store) {
  std::vector<Upload> all;
  auto row = store.query("SELECT uuid, title, workflow_name, user, file_count, size, state, message, started, ended "
                         "FROM uploads ORDER BY rowid");
  while (row.executeStep()) {
    all.push_back(uploadFrom(row));
  }
  return all;
}

int clearEndedUploads(Store& store) {
  return store.execute("DELETE FROM uploads WHERE ended IS NOT NULL");
}

} // namespace lumora::sandbox
