#pragma once

#include <string>
#include <vector>

namespace recorder {

enum class SourceKind { Camera, Screen, Microphone, RemoteCamera };

/// Something that can be recorded, as the user chooses it.
struct SourceDescription {
  SourceKind kind = SourceKind::Camera;
  /// Of a device: its unique identifier. Of a camera of the server: its name. Empty for the screen.
  std::string identifier;
  /// For the user.
  std::string name;

  bool isRemote() const { return kind == SourceKind::RemoteCamera; }
  bool hasPicture() const { return kind != SourceKind::Microphone; }
  /// Whether it is the same source; names may change.
  friend bool operator==(const SourceDescription& left, const SourceDescription& right) {
    return left.kind == right.kind && left.identifier == right.identifier;
  }
};

using SourceDescriptions = std::vector<SourceDescription>;

} // namespace recorder
