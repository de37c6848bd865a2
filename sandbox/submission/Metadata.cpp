#include "Metadata.h"

#include "../Status.h"

#include <LumoraKit/platform/PropertyList.h>

#include <pugixml.hpp>

#include <fstream>
#include <iterator>

namespace lumora::sandbox {

namespace {

[[noreturn]] void refuse(const std::filesystem::path& path, const std::string& reason) {
  throw Refusal(Status::SubmissionFailed, path.string() + ": " + reason);
}

std::string contentOf(const std::filesystem::path& path) {
  // A folder or a named pipe would open as well.
  std::error_code ignored;
  std::ifstream stream(path, std::ios::binary);
  if (!std::filesystem::is_regular_file(path, ignored) || !stream) {
    refuse(path, "the metadata cannot be read");
  }
  return {std::istreambuf_iterator<char>(stream), {}};
}

std::size_t attributeCount(const pugi::xml_node& node) {
  return static_cast<std::size_t>(std::distance(node.attributes().begin(), node.attributes().end()));
}

/// The one child of a node, when it has that name, no attributes and no siblings.
pugi::xml_node onlyChild(const pugi::xml_node& node, const char* name, const std::filesystem::path& path) {
  const auto child = node.first_child();
  if (child.name() != std::string_view(name) || child.next_sibling() || attributeCount(child) != 0) {
    refuse(path, std::string("the element ") + name + " is missing, not alone or has attributes");
  }
  return child;
}

void readProperty(const pugi::xml_node& node, const std::filesystem::path& path, Dictionary& properties) {
  const auto key = node.first_attribute();
  const auto value = key.next_attribute();
  const bool isProperty = node.name() == std::string_view("RecordingProperty") && !node.first_child() &&
                          attributeCount(node) == 2 && key.name() == std::string_view("key") &&
                          value.name() == std::string_view("value");
  if (!isProperty) {
    refuse(path, "RecordingProperties holds what is not an empty RecordingProperty with a key and a value");
  }
  if (properties.contains(key.value())) {
    refuse(path, std::string("the recording property ") + key.value() + " is there twice");
  }
  properties.set(key.value(), key.next_attribute().value());
}

} // namespace

Dictionary readUserMetadata(const std::filesystem::path& path) {
  LMRErrorRef error;
  auto metadata = dictionaryWithXMLDescription_error(contentOf(path), &error);
  if (!metadata) {
    refuse(path, "the metadata is not a property-list dictionary: " +
                     (error ? error->localizedDescription() : std::string("no reason given")));
  }
  return std::move(*metadata);
}

Dictionary readRecordingProperties(const std::filesystem::path& path) {
  const std::string content = contentOf(path);
  pugi::xml_document document;
  const auto parsed = document.load_buffer(content.data(), content.size());
  if (!parsed) {
    refuse(path, std::string("the recording properties are not XML: ") + parsed.description());
  }
  const auto root = onlyChild(document, "LumoraServerAgentRecordingProperties", path);
  Dictionary properties;
  for (const auto& node : onlyChild(root, "RecordingProperties", path)) {
    readProperty(node, path, properties);
  }
  return properties;
}

} // namespace lumora::sandbox
