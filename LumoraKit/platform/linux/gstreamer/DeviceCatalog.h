#pragma once

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/platform/linux/gstreamer/CaptureSource.h>

#include <mutex>

namespace lumora::backend {

/// A device as the system lists it at one moment.
struct ListedDevice {
  std::string uniqueID;
  std::string name;
  MediaType type;
  bool isDefault;
  std::shared_ptr<GstDevice> device;

  /// What its pipeline begins with; an error when it offers no format that can be used.
  CaptureSource makeSource(LMRErrorRef& error) const;
};

/// The machine's cameras and microphones. Sound comes from the PulseAudio interface, which knows the default device
/// and converts formats, video from PipeWire and V4L2. Any thread; every question is answered within 4 seconds.
class DeviceCatalog {
public:
  explicit DeviceCatalog(std::shared_ptr<Queues> queues);

  /// A list up to a second old is good enough to show.
  std::vector<ListedDevice> devices(MediaType type);
  /// Asks the system anew.
  std::optional<ListedDevice> find(const std::string& uniqueID);

private:
  std::vector<ListedDevice> list(HostTime notBefore);

  const std::shared_ptr<Queues> queues_;
  std::mutex mutex_;
  HostTime listedAt_ = 0;
  std::vector<ListedDevice> listed_;
};

} // namespace lumora::backend
