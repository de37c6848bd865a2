#include "Package.h"

#include "../Status.h"

#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/PropertyList.h>

#include <fstream>
#include <iterator>

namespace lumora::sandbox {

namespace fs = std::filesystem;

namespace {

[[noreturn]] void refuse(const fs::path& path, const std::string& reason) {
  throw Refusal(Status::InvalidInput, path.string() + " is no workflow package: " + reason);
}

std::string contentOf(const fs::path& path) {
  std::error_code ignored;
  std::ifstream stream(path, std::ios::binary);
  if (!fs::is_regular_file(path, ignored) || !stream) {
    throw Refusal(Status::FileCopyFailed, path.string() + ": the workflow package cannot be read");
  }
  return {std::istreambuf_iterator<char>(stream), {}};
}

Dictionary dictionaryAt(const fs::path& path) {
  LMRErrorRef error;
  auto package = dictionaryWithXMLDescription_error(contentOf(path), &error);
  if (!package) {
    refuse(path, error ? error->localizedDescription() : "not a property-list dictionary");
  }
  return std::move(*package);
}

void refuseOtherKeys(const fs::path& path, const Dictionary& package) {
  for (const auto& [key, value] : package) {
    if (key != "name" && key != "title" && key != "sources" && key != "protected") {
      refuse(path, "the key \"" + key + "\" is unknown");
    }
  }
}

std::string textUnder(const char* key, const std::string& otherwise, const fs::path& path, const Dictionary& package) {
  const auto* value = package.find(key);
  std::string text = value == nullptr ? otherwise : package.string(key).value_or("");
  if (text.empty()) {
    refuse(path, std::string("\"") + key + "\" is missing, empty or not a string");
  }
  return text;
}

bool isProtected(const fs::path& path, const Dictionary& package) {
  const auto* value = package.find("protected");
  if (value != nullptr && !value->boolean()) {
    refuse(path, "\"protected\" is not a boolean");
  }
  return value != nullptr && *value->boolean();
}

/// Beside the file, so that it can be moved over it.
fs::path temporaryPathBeside(const fs::path& path) {
  return path.parent_path() / ("." + path.filename().string() + "." + makeUUIDString());
}

} // namespace

Workflow readPackage(const fs::path& path) {
  const Dictionary package = dictionaryAt(path);
  refuseOtherKeys(path, package);
  const auto* descriptions = package.array("sources");
  const auto sources = descriptions == nullptr ? std::nullopt : sourcesFrom(*descriptions);
  if (!sources) {
    refuse(path, "\"sources\" is missing, empty or holds what is no source");
  }
  const std::string name = textUnder("name", "", path, package);
  return {"", name, textUnder("title", name, path, package), *sources, isProtected(path, package)};
}

void writePackage(const fs::path& path, const Workflow& workflow) {
  Dictionary package{
      {"name", workflow.name}, {"title", workflow.title}, {"sources", sourcesDescription(workflow.sources)}};
  if (workflow.isProtected) {
    package.set("protected", true);
  }
  const fs::path temporary = temporaryPathBeside(path);
  std::error_code error;
  std::ofstream stream(temporary, std::ios::binary);
  stream << xmlDescription(package).value() << std::flush;
  if (stream) {
    fs::rename(temporary, path, error);
  }
  if (!stream || error) {
    std::error_code ignored;
    fs::remove(temporary, ignored);
    throw Refusal(Status::FileCopyFailed,
                  path.string() + ": " + (error ? error.message() : std::string("the package cannot be written")));
  }
}

} // namespace lumora::sandbox
