#include "EpisodeReport.h"

#include "../store/Recordings.h"
#include "../store/Workflows.h"

#include <sstream>

namespace lumora::sandbox {

namespace {

/// Filing is all or nothing, so every episode that is there is complete.
constexpr const char* state = "completed";

Dictionary describe(const Store& store, const Episode& episode, const StoredFile& file) {
  return {{"name", file.name},
          {"path", (folderOf(store, episode.uuid) / file.storedName).string()},
          {"size", file.size},
          {"sha256", file.sha256}};
}

Dictionary describe(Store& store, const Episode& episode) {
  Dictionary description{{"uuid", episode.uuid},
                         {"title", episode.userMetadata.string("Title").value_or("")},
                         {"description", episode.userMetadata.string("Description").value_or("")},
                         {"workflow", episode.workflowName},
                         {"workflow_uuid", episode.workflowUUID},
                         {"user", episode.user},
                         {"submitted", Date(std::chrono::seconds(episode.submitted))},
                         {"state", state},
                         {"metadata", episode.userMetadata}};
  if (episode.recordingMetadata) {
    description.set("recording_metadata", *episode.recordingMetadata);
  }
  if (episode.slotUUID) {
    const auto slot = findSlot(store, *episode.slotUUID).value();
    description.set("submission_uuid", slot.uuid);
    description.set("recording_uuid", slot.recordingUUID);
    description.set("source_index", slot.position);
  }
  Array files;
  for (const auto& file : episode.files) {
    files.emplace_back(describe(store, episode, file));
  }
  description.set("files", std::move(files));
  return description;
}

class Page {
public:
  void line(std::string_view label, const std::string& text) {
    constexpr std::size_t width = 14;
    stream_ << "  " << label << std::string(width - label.size(), ' ') << text << '\n';
  }
  void entries(std::string_view heading, const Dictionary* dictionary) {
    if (dictionary == nullptr || dictionary->empty()) {
      return;
    }
    stream_ << "  " << heading << '\n';
    for (const auto& [key, value] : *dictionary) {
      stream_ << "    " << key << " = " << value.description() << '\n';
    }
  }
  void file(const Dictionary& file) {
    line("file", file.string("name").value() + ", " + file.find("size")->description() + " bytes");
    line("", "sha256 " + file.string("sha256").value());
    line("", file.string("path").value());
  }
  std::ostringstream& stream() { return stream_; }

private:
  std::ostringstream stream_;
};

void write(Page& page, const Dictionary& episode) {
  page.stream() << "Episode " << episode.string("uuid").value() << '\n';
  for (const auto* key :
       {"title", "description", "workflow", "user", "submitted", "state", "recording_uuid", "source_index"}) {
    if (const auto* value = episode.find(key)) {
      page.line(key, value->description());
    }
  }
  page.entries("metadata", episode.dictionary("metadata"));
  page.entries("recording metadata", episode.dictionary("recording_metadata"));
  for (const auto& file : *episode.array("files")) {
    page.file(*file.dictionary());
  }
}

} // namespace

Dictionary describe(Store& store, const std::vector<Episode>& episodes) {
  Array descriptions;
  for (const auto& episode : episodes) {
    descriptions.emplace_back(describe(store, episode));
  }
  return {{"episodes", std::move(descriptions)}};
}

std::string report(Store& store, const std::vector<Episode>& episodes) {
  Page page;
  for (const auto& episode : episodes) {
    write(page, describe(store, episode));
    page.stream() << '\n';
  }
  page.stream() << episodes.size() << (episodes.size() == 1 ? " episode\n" : " episodes\n");
  return page.stream().str();
}

} // namespace lumora::sandbox
