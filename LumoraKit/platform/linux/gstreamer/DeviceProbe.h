#pragma once

#include <LumoraKit/platform/linux/gstreamer/DeviceCatalog.h>

namespace lumora::backend {

/// Asks the system for its devices. A service that does not answer within 4 seconds has none.
std::vector<ListedDevice> probeDevices(Queues& queues);

} // namespace lumora::backend
