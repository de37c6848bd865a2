#pragma once

#include "recorder/model/Source.h"

#include <LumoraKit/LumoraKit.h>

#include <memory>

namespace recorder {

/// What opens and closes devices does so one after another and off the main thread.
std::shared_ptr<lumora::WorkQueue> captureQueue();

/// A session of the planned devices that does not run yet. Blocks while they are opened.
std::shared_ptr<lumora::CaptureSession> makeSession(const PlannedSource& plan, LMRErrorRef* error);

} // namespace recorder
