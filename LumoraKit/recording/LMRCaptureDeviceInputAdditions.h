#pragma once

#include <LumoraKit/platform/MediaCapture.h>

/// Narrowing a device input to one kind of media. Any thread.
namespace LMRCaptureDeviceInputAdditions {

/// Disables every connection of another media type; those of this type are left as they are.
LUMORA_EXPORT void disableAllConnectionsNotOfMediaType(const lumora::CaptureInput& input, lumora::MediaType type);

} // namespace LMRCaptureDeviceInputAdditions
