#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <memory>
#include <vector>

/// Finding capture devices. Any thread.
namespace LMRCaptureDeviceAdditions {

/// Devices in the order in which the system lists them.
using Devices = std::vector<std::shared_ptr<lumora::CaptureDevice>>;

/// The default device for sound, without one the default muxed device, else null.
LUMORA_EXPORT std::shared_ptr<lumora::CaptureDevice> defaultAudioCaptureDevice();
/// The default device for video, without one the default muxed device, else null.
LUMORA_EXPORT std::shared_ptr<lumora::CaptureDevice> defaultVideoCaptureDevice();

/// All devices for sound, then all muxed ones.
LUMORA_EXPORT Devices audioCaptureDevices();
/// All devices for video, then all muxed ones.
LUMORA_EXPORT Devices videoCaptureDevices();
/// The devices of each type in the order of the types; a device of two of them is listed twice.
LUMORA_EXPORT Devices inputDevicesWithMediaTypes(const std::vector<lumora::MediaType>& types);

} // namespace LMRCaptureDeviceAdditions
