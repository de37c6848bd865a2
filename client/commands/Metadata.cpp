#include "Metadata.h"

#include "../grammar/Values.h"
#include "../output/Text.h"

#include <filesystem>
#include <fstream>
#include <sstream>

namespace lumora::client {

namespace {

Dictionary metadataFile(const std::string& path) {
  std::ifstream file(readableFile(path), std::ios::binary);
  if (std::filesystem::is_directory(path)) {
    throw Failure(exitNoInput, inQuotes(path) + " cannot be read: it is a folder.");
  }
  std::ostringstream content;
  content << file.rdbuf();
  LMRErrorRef error;
  auto dictionary = dictionaryWithXMLDescription_error(content.str(), &error);
  if (!dictionary) {
    throw Failure(exitBadData, inQuotes(path) + " is no property list with a dictionary: " +
                                   printable(error->localizedDescription()) + ".");
  }
  return std::move(*dictionary);
}

void setPairs(Dictionary& dictionary, const std::vector<std::string>& texts) {
  for (const auto& text : texts) {
    const auto [key, value] = pair(text).value();
    dictionary.set(key, value);
  }
}

// The framework's factories write the metadata, and cannot say what is in the way.
void checkWritable(const Dictionary& metadata) {
  LMRErrorRef error;
  if (!xmlDescription(metadata, &error)) {
    throw Failure(exitBadData, "The metadata cannot be sent: " + printable(error->localizedDescription()) + ".");
  }
  const auto trial = LMRActionFactoryAdditions::writeToApplicationSupport(metadata);
  if (!trial) {
    const auto folders = Platform::current().files->applicationSupportDirectories();
    throw Failure(exitCannotCreate, "The metadata cannot be written below " +
                                        inQuotes(folders.empty() ? "" : folders.front().string()) + ".");
  }
  Platform::current().files->removeFile(*trial);
}

} // namespace

std::vector<Option> withMetadataOptions(std::vector<Option> options) {
  options.insert(
      options.end(),
      {
          {.name = "--title", .letter = 't', .value = "TITLE", .kind = Kind::Text, .help = "the episode's title"},
          {.name = "--description",
           .letter = 'd',
           .value = "TEXT",
           .kind = Kind::Text,
           .help = "the episode's description"},
          {.name = "--metadata",
           .value = "KEY=VALUE",
           .kind = Kind::Pair,
           .help = "a further entry of the metadata; may be repeated",
           .repeats = true},
          {.name = "--metadata-file",
           .value = "FILE",
           .kind = Kind::File,
           .help = "take the metadata from the dictionary in an XML property list; the other "
                   "options add to it"},
      });
  return options;
}

Dictionary userMetadata(const CommandLine& line) {
  Dictionary metadata;
  if (const auto path = line.value("--metadata-file")) {
    metadata = metadataFile(*path);
  }
  setPairs(metadata, line.values("--metadata"));
  for (const auto& [option, key] : {std::pair("--title", LMREpisodeUserMetadataTitleKey),
                                    {"--description", LMREpisodeUserMetadataDescriptionKey}}) {
    if (const auto value = line.value(option)) {
      metadata.set(key, *value);
    }
  }
  checkWritable(metadata);
  return metadata;
}

std::optional<Dictionary> recordingMetadata(const CommandLine& line) {
  Dictionary metadata;
  setPairs(metadata, line.values("--recording-metadata"));
  if (const auto text = line.value("--recording-start")) {
    metadata.set(LMREpisodeRecordingMetadataStartDateKey, date(*text).value());
  }
  if (const auto text = line.value("--recording-end")) {
    metadata.set(LMREpisodeRecordingMetadataStopDateKey, date(*text).value());
  }
  if (const auto text = line.value("--recording-duration")) {
    metadata.set(LMREpisodeRecordingMetadataDurationKey, seconds(*text).value());
  }
  if (metadata.empty()) {
    return std::nullopt;
  }
  checkWritable(metadata);
  return metadata;
}

MetadataFiles::MetadataFiles(const LMRAction& action) {
  for (const Value& argument : action.arguments().value_or(Array())) {
    const Array* const pair = argument.array();
    const std::string* const key = pair != nullptr && pair->size() == 2 ? pair->front().string() : nullptr;
    const std::string* const path = key != nullptr ? pair->back().string() : nullptr;
    if (path != nullptr && (*key == "metadata" || *key == "recording_metadata")) {
      paths_.push_back(*path);
    }
  }
}

MetadataFiles::~MetadataFiles() {
  for (const auto& path : paths_) {
    Platform::current().files->removeFile(path);
  }
}

} // namespace lumora::client
