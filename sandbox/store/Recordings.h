#pragma once

#include "Store.h"
#include "Users.h"
#include "Workflows.h"

#include <vector>

/// \file
/// Recording containers: one recording of several sources, each with a place that a submission is filed into.

namespace lumora::sandbox {

struct Recording {
  std::string uuid;
  std::vector<std::string> submissionUUIDs;
};

/// A place in a container.
struct Slot {
  std::string uuid;
  std::string recordingUUID;
  std::int64_t position = 0;
  std::string workflowUUID;
  std::string workflowName;
  std::string user;
  bool isFiled = false;
};

/// A container with one place for each source of the workflow (at least one).
Recording createRecording(Store& store, const Workflow& workflow, const User& user);
std::optional<Slot> findSlot(Store& store, const std::string& submissionUUID);

} // namespace lumora::sandbox
