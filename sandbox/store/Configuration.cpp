#include "Configuration.h"

#include <algorithm>
#include <array>

namespace lumora::sandbox {

namespace {

constexpr std::array<const char*, 6> keys{cameraNameKey,         serverHostKey,         "Capture",
                                          "RecordingVideoInput", "RecordingAudioInput", "RecordingCapturePreset"};

std::string valueOf(Store& store, const std::string& key) {
  auto row = store.query("SELECT value FROM configuration WHERE key = ?", key);
  return row.executeStep() ? row.getColumn(0).getString() : "";
}

} // namespace

bool isConfigurationKey(const std::string& key) {
  return std::find(keys.begin(), keys.end(), key) != keys.end();
}

std::vector<std::pair<std::string, std::string>> configuration(Store& store) {
  std::vector<std::pair<std::string, std::string>> all;
  all.reserve(keys.size());
  for (const auto* key : keys) {
    all.emplace_back(key, valueOf(store, key));
  }
  return all;
}

void configure(Store& store, const std::string& key, const std::string& value) {
  store.execute("INSERT INTO configuration VALUES (?, ?) ON CONFLICT (key) DO UPDATE SET value = excluded.value", key,
                value);
}

} // namespace lumora::sandbox
