#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <string>

namespace lumora::fakes {

/// An error as a capture system tells it.
inline LMRErrorRef captureError(CaptureErrorCode code, std::string description) {
  return LMRError::make(LMRCaptureErrorDomain, static_cast<std::int64_t>(code), std::move(description));
}

} // namespace lumora::fakes
