#pragma once

#include "Store.h"

#include <vector>

/// \file
/// The remote cameras and what each is doing. Nothing runs for a camera: its state follows from what was recorded about
/// it and the time.

namespace lumora::sandbox {

/// One recording of a camera, from its start to its stop or cancellation. Moments are milliseconds since 1970.
struct Take {
  std::string uuid;
  /// Who started it.
  std::string user;
  bool isAudioOnly = false;
  /// When the delay of the start is over.
  std::int64_t begins = 0;
  /// Since when it records without a pause; absent while it is paused.
  std::optional<std::int64_t> since;
  /// Milliseconds recorded before that.
  std::int64_t recorded = 0;
};

struct Camera {
  std::string name;
  /// Names its preview image.
  std::string uuid;
  /// This machine's own camera, shared by "bind".
  bool isBound = false;
  std::optional<Take> take;
};

enum class CameraState { Idle, Starting, Recording, Paused };

/// "idle", "starting", "recording", "paused".
std::string_view nameOf(CameraState state);
CameraState stateAt(const Camera& camera, std::int64_t moment);
/// Milliseconds of material that the take has at the moment.
std::int64_t recordedAt(const Take& take, std::int64_t moment);

/// Adds an idle camera; a name that is taken is an error.
void addCamera(Store& store, const std::string& name, bool isBound);
/// False when there is none. What it was recording is lost.
bool removeCamera(Store& store, const std::string& name);
/// By name.
std::vector<Camera> cameras(Store& store);
std::optional<Camera> findCamera(Store& store, const std::string& name);
std::optional<Camera> boundCamera(Store& store);
/// Records what the camera is doing. To be called within the change of the store that looked at it.
void saveTake(Store& store, const Camera& camera);

std::filesystem::path previewPath(const Store& store, const Camera& camera);

} // namespace lumora::sandbox
