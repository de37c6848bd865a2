#pragma once

#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>

namespace lumora::backend {

/// The format to ask of a camera that offers `offered`: the largest picture up to 1280 x 720 that comes 30 times a
/// second or, when none does, at whatever rate the camera has. Uncompressed pictures are preferred to JPEG of the same
/// size. Null when the camera offers neither.
GstPtr<GstCaps> chooseVideoFormat(GstCaps& offered);

} // namespace lumora::backend
