#include "recorder/model/Settings.h"

#include <array>

namespace recorder {
namespace {

constexpr std::string_view qualityKey = "RecorderQuality";
constexpr std::string_view encoderKey = "RecorderEncoder";
constexpr std::string_view cameraKey = "RecorderCamera";
constexpr std::string_view microphoneKey = "RecorderMicrophone";
constexpr std::string_view workflowKey = "RecorderWorkflow";

struct QualityName {
  Quality quality;
  std::string_view name;
  // Bits a second; 0: the framework's choice.
  std::uint32_t bitRate;
};
constexpr std::array qualities{
    QualityName{Quality::Small, "small", 1'500'000},
    QualityName{Quality::Standard, "standard", 0},
    QualityName{Quality::High, "high", 8'000'000},
};

std::string stored(std::string_view key) {
  const auto& platform = lumora::Platform::current();
  const auto value = platform.preferences->value(platform.application->identifier(), key);
  const std::string* const text = value ? value->string() : nullptr;
  return text ? *text : "";
}

// An empty text is not kept.
void store(std::string_view key, const std::string& text) {
  const auto& platform = lumora::Platform::current();
  platform.preferences->setValue(platform.application->identifier(), key,
                                 text.empty() ? std::nullopt : std::optional<lumora::Value>(text));
}

} // namespace

Settings Settings::load() {
  Settings settings;
  if (const std::string folder = stored(LMRRecorderDestinationFolder); !folder.empty()) {
    settings.folder = folder;
  }
  const std::string name = stored(qualityKey);
  for (const QualityName& each : qualities) {
    settings.quality = each.name == name ? each.quality : settings.quality;
  }
  settings.encoder = stored(encoderKey);
  settings.camera = stored(cameraKey);
  settings.microphone = stored(microphoneKey);
  settings.workflow = stored(workflowKey);
  return settings;
}

void Settings::save() const {
  store(LMRRecorderDestinationFolder, folder ? folder->string() : "");
  for (const QualityName& each : qualities) {
    if (each.quality == quality) {
      store(qualityKey, std::string(each.name));
    }
  }
  store(encoderKey, encoder);
  store(cameraKey, camera);
  store(microphoneKey, microphone);
  store(workflowKey, workflow);
}

std::optional<lumora::CompressionOptions> Settings::videoCompression() const {
  lumora::CompressionOptions options;
  for (const QualityName& each : qualities) {
    if (each.quality == quality && each.bitRate != 0) {
      options.bitRate = each.bitRate;
    }
  }
  if (!encoder.empty()) {
    options.encoder = encoder;
  }
  return options == lumora::CompressionOptions() ? std::nullopt : std::optional(options);
}

} // namespace recorder
