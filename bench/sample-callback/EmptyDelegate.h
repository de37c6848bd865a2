#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <memory>

/// The least that a callback costs. Made out of the compiler's sight, as the recorder is: a call that it could resolve
/// would be no virtual call.
std::shared_ptr<lumora::MovieFileOutputDelegate> makeEmptyDelegate();
