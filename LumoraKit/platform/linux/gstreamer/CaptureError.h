#pragma once

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>

namespace lumora::backend {

LMRErrorRef captureError(CaptureErrorCode code, std::string text);

/// What an error message on a device's bus means.
LMRErrorRef deviceError(const std::string& device, GstMessage& message);

/// What an error message on a recording's bus means.
LMRErrorRef recordingError(GstMessage& message);

} // namespace lumora::backend
