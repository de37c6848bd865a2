#include <LumoraKit/actions/LMRActionFactoryAdditions.h>
#include <LumoraKit/actions/LMRApplicationSupportDirectory.h>
#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/XMLDocument.h>

#include <filesystem>
#include <string_view>

namespace {

lumora::XMLElement recordingProperties(const lumora::Dictionary& dictionary) {
  lumora::XMLElement properties{"RecordingProperties", {}, {}};
  for (const auto& [key, value] : dictionary) {
    properties.children.push_back({"RecordingProperty", {{"key", key}, {"value", value.description()}}, {}});
  }
  return {"LumoraServerAgentRecordingProperties", {}, {std::move(properties)}};
}

// The name's format is filled with a new UUID.
std::optional<std::string> writeNewFile(std::string_view nameFormat, const std::optional<std::string>& content) {
  const auto folder = LMRApplicationSupportDirectory();
  if (!folder || !content) {
    return std::nullopt;
  }
  const auto path = std::filesystem::path(*folder) / lumora::format(nameFormat, {lumora::makeUUIDString()});
  if (const auto error = lumora::Platform::current().files->writeAtomically(path, *content)) {
    lumora::log("writeToFile:%@ failed %@", {lumora::text(path), lumora::text(error)});
    return std::nullopt;
  }
  return path.string();
}

} // namespace

namespace LMRActionFactoryAdditions {

std::optional<std::string> writeXMLToApplicationSupport(const lumora::Dictionary& dictionary) {
  return writeNewFile("%@.xml", lumora::xmlDocument(recordingProperties(dictionary)));
}

std::optional<std::string> writeToApplicationSupport(const lumora::Dictionary& dictionary) {
  return writeNewFile("%@.plist", lumora::xmlDescription(dictionary));
}

} // namespace LMRActionFactoryAdditions
