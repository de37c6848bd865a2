#include "Workflows.h"

#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/PropertyList.h>

#include <stdexcept>

namespace lumora::sandbox {

namespace {

Value sourceDescription(const WorkflowSource& source) {
  Array types(source.types.begin(), source.types.end());
  return Dictionary{{"sourceTypes", std::move(types)}, {"isFolder", source.isFolder}};
}

std::optional<WorkflowSource> sourceFrom(const Value& value) {
  const auto* description = value.dictionary();
  const auto* types = description != nullptr ? description->array("sourceTypes") : nullptr;
  if (types == nullptr || types->empty()) {
    return std::nullopt;
  }
  WorkflowSource source;
  for (const auto& type : *types) {
    if (type.string() == nullptr || !isSourceType(*type.string())) {
      return std::nullopt;
    }
    source.types.push_back(*type.string());
  }
  const auto* isFolder = description->find("isFolder");
  if (isFolder != nullptr && !isFolder->boolean()) {
    return std::nullopt;
  }
  source.isFolder = isFolder != nullptr && *isFolder->boolean();
  return source;
}

std::string textOf(const std::vector<WorkflowSource>& sources) {
  return xmlDescription(sourcesDescription(sources)).value();
}

constexpr const char* columns = "SELECT uuid, name, title, sources, is_protected FROM workflows ";

Workflow workflowFrom(SQLite::Statement& row) {
  return {row.getColumn(0).getString(), row.getColumn(1).getString(), row.getColumn(2).getString(),
          sourcesFrom(*valueWithXMLDescription(row.getColumn(3).getString()).value().array()).value(),
          row.getColumn(4).getInt() != 0};
}

} // namespace

std::string addWorkflow(Store& store, const Workflow& workflow) {
  if (findWorkflow(store, workflow.name)) {
    throw std::runtime_error("there is a workflow named " + workflow.name + " already");
  }
  std::string uuid = makeUUIDString();
  store.execute("INSERT INTO workflows VALUES (?, ?, ?, ?, ?, ?)", uuid, workflow.name, workflow.title,
                textOf(workflow.sources), std::int64_t{workflow.isProtected}, currentTime());
  return uuid;
}

void replaceWorkflow(Store& store, const Workflow& workflow) {
  store.execute("UPDATE workflows SET title = ?, sources = ?, is_protected = ? WHERE name = ?", workflow.title,
                textOf(workflow.sources), std::int64_t{workflow.isProtected}, workflow.name);
}

void addDefaultWorkflows(Store& store) {
  addWorkflow(store, {"", "single-video", "Single Video", {{{"Video", "File"}, false}}, false});
  addWorkflow(store, {"", "screen-recording", "Screen Recording", {{{"Screen"}, false}}, false});
  addWorkflow(store, {"", "audio-podcast", "Audio Podcast", {{{"Audio"}, false}}, false});
  addWorkflow(store, {"", "camera-and-screen", "Camera and Screen", {{{"Video"}, false}, {{"Screen"}, false}}, false});
  addWorkflow(store, {"", "folder-of-files", "Folder of Files", {{{"File"}, true}}, false});
}

bool removeWorkflow(Store& store, const std::string& nameOrUUID) {
  return store.execute("DELETE FROM workflows WHERE name = ?1 OR uuid = ?1", nameOrUUID) > 0;
}

std::vector<Workflow> workflows(Store& store) {
  std::vector<Workflow> all;
  auto row = store.query((std::string(columns) + "ORDER BY rowid").c_str());
  while (row.executeStep()) {
    all.push_back(workflowFrom(row));
  }
  return all;
}

std::optional<Workflow> findWorkflow(Store& store, const std::string& nameOrUUID) {
  auto row = store.query((std::string(columns) + "WHERE name = ?1 OR uuid = ?1").c_str(), nameOrUUID);
  return row.executeStep() ? std::optional(workflowFrom(row)) : std::nullopt;
}

std::optional<Workflow> findWorkflowWithUUID(Store& store, const std::string& uuid) {
  auto workflow = findWorkflow(store, uuid);
  return workflow && workflow->uuid == uuid ? std::move(workflow) : std::nullopt;
}

bool isSourceType(const std::string& word) {
  return word == "Video" || word == "Screen" || word == "Audio" || word == "File";
}

Array sourcesDescription(const std::vector<WorkflowSource>& sources) {
  Array descriptions;
  for (const auto& source : sources) {
    descriptions.push_back(sourceDescription(source));
  }
  return descriptions;
}

std::optional<std::vector<WorkflowSource>> sourcesFrom(const Array& descriptions) {
  std::vector<WorkflowSource> sources;
  for (const auto& description : descriptions) {
    auto source = sourceFrom(description);
    if (!source) {
      return std::nullopt;
    }
    sources.push_back(std::move(*source));
  }
  return sources.empty() ? std::nullopt : std::optional(std::move(sources));
}

Dictionary description(const Workflow& workflow) {
  return {{"name", workflow.name},
          {"title", workflow.title},
          {"uuid", workflow.uuid},
          {"sources", sourcesDescription(workflow.sources)}};
}

} // namespace lumora::sandbox
