#pragma once

#include <gst/gst.h>

namespace lumora::backend {

/// Has every buffer that a sound source delivers carry the time of its capture, as running time. The source must count
/// samples without any correction of its own.
void stampByArrival(GstElement& source);

} // namespace lumora::backend
