#include "../store/Uploads.h"
#include "../submission/Staging.h"
#include "Command.h"

namespace lumora::sandbox {

namespace {

Value dateOf(std::int64_t seconds) {
  return Date(std::chrono::seconds(seconds));
}

Dictionary description(const Upload& upload) {
  Dictionary description{{"uuid", upload.uuid},
                         {"title", upload.title},
                         {"workflow", upload.workflowName},
                         {"user", upload.user},
                         {"file_count", upload.fileCount},
                         {"size", upload.size},
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
    descriptions.emplace_back(description(upload));
  }
  return {{"uploads", std::move(descriptions)}};
}

Dictionary clearCompletedUploads(Context& context, const Arguments&) {
  return {{"cleared", clearEndedUploads(context.store)}};
}

} // namespace lumora::sandbox
