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

Array sourcesDescription(const std::vector<WorkflowSource>& sources) {
  Array descriptions;
  for (const auto& source : sources) {
    descriptions.push_back(sourceDescription(source));
  }
  return descriptions;
}

WorkflowSource sourceFrom(const Dictionary& description) {
  WorkflowSource source;
  for (const auto& type : *description.array("sourceTypes")) {
    source.types.push_back(*type.string());
  }
  source.isFolder = description.find("isFolder")->boolean().value();
  return source;
}

std::vector<WorkflowSource> sourcesFrom(const std::string& text) {
  const auto descriptions = valueWithXMLDescription(text);
  std::vector<WorkflowSource> sources;
  for (const auto& description : *descriptions.value().array()) {
    sources.push_back(sourceFrom(*description.dictionary()));
  }
  return sources;
}

constexpr const char* columns = "SELECT uuid, name, title, sources FROM workflows ";

Workflow workflowFrom(SQLite::Statement& row) {
  return {row.getColumn(0).getString(), row.getColumn(1).getString(), row.getColumn(2).getString(),
          sourcesFrom(row.getColumn(3).getString())};
}

} // namespace

std::string addWorkflow(Store& store, const Workflow& workflow) {
  if (findWorkflow(store, workflow.name)) {
    throw std::runtime_error("there is a workflow named " + workflow.name + " already");
  }
  const std::string uuid = makeUUIDString();
  store.execute("INSERT INTO workflows VALUES (?, ?, ?, ?, ?)", uuid, workflow.name, workflow.title,
                xmlDescription(sourcesDescription(workflow.sources)).value(), currentTime());
  return uuid;
}

void addDefaultWorkflows(Store& store) {
  addWorkflow(store, {"", "single-video", "Single Video", {{{"Video", "File"}, false}}});
  addWorkflow(store, {"", "screen-recording", "Screen Recording", {{{"Screen"}, false}}});
  addWorkflow(store, {"", "audio-podcast", "Audio Podcast", {{{"Audio"}, false}}});
  addWorkflow(store, {"", "camera-and-screen", "Camera and Screen", {{{"Video"}, false}, {{"Screen"}, false}}});
  addWorkflow(store, {"", "folder-of-files", "Folder of Files", {{{"File"}, true}}});
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

Dictionary description(const Workflow& workflow) {
  return {{"name", workflow.name},
          {"title", workflow.title},
          {"uuid", workflow.uuid},
          {"sources", sourcesDescription(workflow.sources)}};
}

} // namespace lumora::sandbox
