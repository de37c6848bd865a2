#pragma once

#include <gst/gst.h>

namespace lumora::backend {

/// Gives a PipeWire source a connection to the server of its own. Left alone, all sources and the listing of devices
/// share one, and of it the device provider of PipeWire 0.3 keeps the nodes that it once listed, with the devices that
/// it gave away: when a node goes, or the connection ends, it uses those that are long gone. Without a server the
/// source is left as it is, and tells so itself.
void connectApart(GstElement& source);

} // namespace lumora::backend
