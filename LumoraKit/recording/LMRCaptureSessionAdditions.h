#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <memory>

/// Building capture sessions for the recorders. Each function returns a new session that is not running (the
/// application starts it), or null with a log line and, unless it says otherwise, the error in `*error`; `error` must
/// not be null and is left alone on success. A missing device is error 1 of LMRRecorderErrorDomain; errors of the
/// capture system are passed on as they are. Any thread. Block while devices are opened.
namespace LMRCaptureSessionAdditions {

/// A session that does not run yet; null when it could not be built.
using Session = std::shared_ptr<lumora::CaptureSession>;
/// A device to be opened; null where a function takes none.
using Device = std::shared_ptr<lumora::CaptureDevice>;

/// A microphone and a camera, which may be one device. A muxed device that is only one of the two gives only its own
/// kind of media.
LUMORA_EXPORT Session captureSessionWithAudioDevice_videoDevice_error(const Device& audioDevice,
                                                                      const Device& videoDevice, LMRErrorRef* error);
/// A microphone.
LUMORA_EXPORT Session captureSessionWithAudioDevice_error(const Device& audioDevice, LMRErrorRef* error);
/// The main screen and a microphone, or only the screen when the device is null. The error is not told: `*error` stays
/// untouched when the microphone fails, and becomes null when the screen does.
LUMORA_EXPORT Session captureSessionWithScreenInputAndAudioDevice_error(const Device& audioDevice, LMRErrorRef* error);

} // namespace LMRCaptureSessionAdditions
