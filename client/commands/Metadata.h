#pragma once

#include "Context.h"

namespace lumora::client {

/// The options about the user metadata, with others before them.
std::vector<Option> withMetadataOptions(std::vector<Option> options);

/// What the metadata file holds, what the pairs say, the title and the description. A Failure when it cannot be
/// written for the tools.
Dictionary userMetadata(const CommandLine& line);

/// Of the recording itself; nothing when no option speaks of it.
std::optional<Dictionary> recordingMetadata(const CommandLine& line);

/// Removes the metadata files of an action, which nobody else does, when the action is over.
class MetadataFiles {
public:
  explicit MetadataFiles(const LMRAction& action);
  MetadataFiles(const MetadataFiles&) = delete;
  MetadataFiles& operator=(const MetadataFiles&) = delete;
  ~MetadataFiles();

private:
  std::vector<std::string> paths_;
};

} // namespace lumora::client
