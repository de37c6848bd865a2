#pragma once

#include "Store.h"

#include <vector>

/// \file
/// Submissions that go on after the tool has ended, as "list_uploads" shows them.

namespace lumora::sandbox {

struct Upload {
  /// Of the episode that it becomes.
  std::string uuid;
  std::string title;
  std::string workflowName;
  std::string user;
  std::int64_t fileCount = 0;
  std::int64_t size = 0;
  /// "uploading", then "completed" or "failed".
  std::string state = "uploading";
  /// Why it failed.
  std::optional<std::string> message;
  std::int64_t started = 0;
  std::optional<std::int64_t> ended;
};

void insertUpload(Store& store, const Upload& upload);
void completeUpload(Store& store, const std::string& uuid);
/// Does nothing to an upload that has ended.
void failUpload(Store& store, const std::string& uuid, const std::string& message);
std::vector<Upload> uploads(Store& store);
/// Forgets those that have ended; how many there were.
int clearEndedUploads(Store& store);

} // namespace lumora::sandbox
