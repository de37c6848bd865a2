#pragma once

#include <LumoraKit/LumoraKit.h>

#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

namespace recorder {

enum class Quality { Small, Standard, High };

/// What the user has set, kept in the application's preferences.
struct Settings {
  /// Where recordings go; nothing: the framework's folder.
  std::optional<std::filesystem::path> folder;
  Quality quality = Quality::Standard;
  /// Identifier of the encoder for pictures; empty: the framework's choice.
  std::string encoder;
  /// Identifiers of the devices to begin with; empty: the system's defaults.
  std::string camera;
  std::string microphone;
  /// UUID of the workflow that was used last; empty: none.
  std::string workflow;

  static Settings load();
  void save() const;

  /// How pictures are encoded; nothing: the framework's choice.
  std::optional<lumora::CompressionOptions> videoCompression() const;

  friend bool operator==(const Settings&, const Settings&) = default;
};

} // namespace recorder
