#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/ArrivalStamp.h>
#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>
#include <LumoraKit/platform/linux/gstreamer/DelegateCall.h>
#include <LumoraKit/platform/linux/gstreamer/DeviceCatalog.h>
#include <LumoraKit/platform/linux/gstreamer/DeviceProbe.h>
#include <LumoraKit/platform/linux/gstreamer/PipeWireConnection.h>
#include <LumoraKit/platform/linux/gstreamer/VideoFormat.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>

#include <algorithm>

namespace lumora::backend {
namespace {

constexpr HostTime goodFor = 1'000'000'000;

// One format for all sound: the sound server converts, and nothing changes in mid-recording.
constexpr const char* soundFormat = "audio/x-raw, format=S16LE, layout=interleaved, rate=48000, channels=2";

bool hasProperty(GstElement& element, const char* name) {
  return g_object_class_find_property(G_OBJECT_GET_CLASS(&element), name) != nullptr;
}

void prepareSound(CaptureSource& source) {
  GstPtr<gchar> device;
  g_object_get(source.element.get(), "device", static_cast<gchar**>(GstOut(device)), nullptr);
  source.soundDevice = device ? device.get() : "";
  // 20 ms a buffer: asked for less, the sound server of a busy machine loses some. The source's own ways to follow a
  // clock are off by up to a buffer from the start, and by 200 ms in the end.
  g_object_set(source.element.get(), "provide-clock", FALSE, "latency-time", gint64{20'000}, nullptr);
  gst_util_set_object_arg(G_OBJECT(source.element.get()), "slave-method", "none");
  stampByArrival(*source.element);
  source.caps.reset(gst_caps_from_string(soundFormat));
}

void prepareVideo(CaptureSource& source, GstDevice& device) {
  // A camera of PipeWire has few buffers and stops for good when they are held.
  if (hasProperty(*source.element, "always-copy")) {
    g_object_set(source.element.get(), "always-copy", TRUE, nullptr);
    connectApart(*source.element);
  }
  const GstPtr<GstCaps> offered(gst_device_get_caps(&device));
  source.caps = offered ? chooseVideoFormat(*offered) : nullptr;
}

} // namespace

CaptureSource ListedDevice::makeSource(LMRErrorRef& error) const {
  CaptureSource source;
  source.element.reset(gst_device_create_element(device.get(), nullptr));
  if (source.element) {
    gst_object_ref_sink(source.element.get());
    if (type == MediaType::Sound) {
      prepareSound(source);
    } else {
      prepareVideo(source, *device);
    }
  }
  if (!source.caps) {
    error = captureError(CaptureErrorCode::DeviceFailed, format("%@ offers no usable format", {name}));
  }
  return source;
}

DeviceCatalog::DeviceCatalog(std::shared_ptr<Queues> queues) : queues_(std::move(queues)) {}

std::vector<ListedDevice> DeviceCatalog::devices(MediaType type) {
  std::vector<ListedDevice> devices = list(hostTimeNow() - goodFor);
  std::erase_if(devices, [type](const ListedDevice& device) { return device.type != type; });
  return devices;
}

std::optional<ListedDevice> DeviceCatalog::find(const std::string& uniqueID) {
  const std::vector<ListedDevice> devices = list(hostTimeNow());
  const auto found = std::ranges::find(devices, uniqueID, &ListedDevice::uniqueID);
  return found == devices.end() ? std::nullopt : std::optional(*found);
}

std::vector<ListedDevice> DeviceCatalog::list(HostTime notBefore) {
  const std::lock_guard lock(mutex_);
  if (listedAt_ < notBefore) {
    listed_ = probeDevices(*queues_);
    listedAt_ = hostTimeNow();
  }
  return listed_;
}

} // namespace lumora::backend
