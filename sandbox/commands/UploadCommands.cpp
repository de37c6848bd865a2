#include "../store/Uploads.h"
#include "../submission/Staging.h"
#include "Command.h"

#include <algorithm>

namespace lumora::sandbox {

namespace {

Value dateOf(std::int64_t seconds) {
  return Date(std::chrono::seconds(seconds));
}

/// How much of it has arrived; nothing is kept of one that failed.
std::int64_t sentBytes(const Store& store, const Upload& upload) {
  if (upload.state == "completed") {
    return upload.size;
  }
  return upload.ended ? 0 : std::min(bytesOfUpload(store, upload.uuid), upload.size);
}

Dictionary description(const Store& store, const Upload& upload) {
  Dictionary description{{"uuid", upload.uuid},
                         {"title", upload.title},
                         {"workflow", upload.workflowName},
                         {"user", upload.user},
                         {"file_count", upload.fileCount},
                         {"size", upload.size},
                         {"sent", sentBytes(store, upload)},
                         {"state", upload.state},
                         {"started", dateOf(upload.started)}};
  if (upload.ended) {
    description.set("ended", dateOf(*upload.ended));
  }
  if (upload.message) {
    description.set("message", *upload.message);
  }
  return description;
}

} // namespace

Dictionary listUploads(Context& context, const Arguments&) {
  clearAway(context.store);
  Array descriptions;
  for (const auto& upload : uploads(context.store)) {
    descriptions.emplace_back(description(context.store, upload));
  }
  return {{"uploads", std::move(descriptions)}};
}

Dictionary clearCompletedUploads(Context& context, const Arguments&) {
  return {{"cleared", clearEndedUploads(context.store)}};
}

} // namespace lumora::sandbox
