#pragma once

#include "Store.h"

#include <LumoraKit/platform/Value.h>

#include <vector>

namespace lumora::sandbox {

/// One input of a workflow.
struct WorkflowSource {
  /// "Video", "Screen", "Audio", "File".
  std::vector<std::string> types;
  /// Takes a folder of files rather than one recording.
  bool isFolder = false;
};

struct Workflow {
  std::string uuid;
  std::string name;
  std::string title;
  std::vector<WorkflowSource> sources;
};

/// Adds a workflow under a new UUID, which is returned; a name that is taken is an error.
std::string addWorkflow(Store& store, const Workflow& workflow);
/// One of each kind, as a new server has them.
void addDefaultWorkflows(Store& store);
/// By name or UUID; false when there is none.
bool removeWorkflow(Store& store, const std::string& nameOrUUID);
/// In the order they were added.
std::vector<Workflow> workflows(Store& store);
/// By name or UUID.
std::optional<Workflow> findWorkflow(Store& store, const std::string& nameOrUUID);

/// The workflow as the tools describe it: "name", "title", "uuid", "sources".
Dictionary description(const Workflow& workflow);

} // namespace lumora::sandbox
