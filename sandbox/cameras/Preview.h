#pragma once

#include "../store/Cameras.h"

#include <LumoraKit/platform/Value.h>

namespace lumora::sandbox {

/// Takes a new preview image of what the camera sees; the file is replaced whole.
void updatePreview(const Store& store, const Camera& camera);
/// The preview image that was taken last, as a PNG file.
Data readPreview(const Store& store, const Camera& camera);

} // namespace lumora::sandbox
