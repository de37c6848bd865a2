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
  /// Was installed with the server's master password, and can be only so.
  bool isProtected = false;
};

/// Adds a workflow under a new UUID, which is returned; a name that is taken is an error.
std::string addWorkflow(Store& store, const Workflow& workflow);
/// Gives the workflow of that name another title, other sources and another protection; it keeps its UUID.
void replaceWorkflow(Store& store, const Workflow& workflow);
/// One of each kind, as a new server has them.
void addDefaultWorkflows(Store& store);
/// By name or UUID; false when there is none.
bool removeWorkflow(Store& store, const std::string& nameOrUUID);
/// In the order they were added.
std::vector<Workflow> workflows(Store& store);
/// By name or UUID.
std::optional<Workflow> findWorkflow(Store& store, const std::string& nameOrUUID);
/// By UUID only.
std::optional<Workflow> findWorkflowWithUUID(Store& store, const std::string& uuid);

/// The sources as the tools and the packages describe them: each with "sourceTypes" and "isFolder".
Array sourcesDescription(const std::vector<WorkflowSource>& sources);
/// Reads such a description; nothing when it is none, is empty or names an unknown type. "isFolder" may be absent.
std::optional<std::vector<WorkflowSource>> sourcesFrom(const Array& descriptions);
bool isSourceType(const std::string& word);

/// The workflow as the tools describe it: "name", "title", "uuid", "sources".
Dictionary description(const Workflow& workflow);

} // namespace lumora::sandbox
