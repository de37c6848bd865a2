#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>
#include <LumoraKit/platform/linux/gstreamer/Inputs.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>

#include <cstdlib>

namespace lumora::backend {
namespace {

constexpr std::chrono::seconds patience{5};

constexpr const char* screenFormat = "video/x-raw, framerate=30/1";

std::string environment(const char* name) {
  const char* const value = std::getenv(name);
  return value ? value : "";
}

} // namespace

GStreamerDevice::GStreamerDevice(const ListedDevice& device, std::shared_ptr<DeviceCatalog> catalog,
                                 std::shared_ptr<Queues> queues)
    : uniqueID_(device.uniqueID), name_(device.name), type_(device.type), catalog_(std::move(catalog)),
      queues_(std::move(queues)) {}

CaptureSource GStreamerDevice::makeSource(LMRErrorRef& error) const {
  if (const auto device = catalog_->find(uniqueID_)) {
    return device->makeSource(error);
  }
  error = captureError(CaptureErrorCode::DeviceMissing, format("%@ is not connected", {name_}));
  return {};
}

LMRErrorRef GStreamerDevice::open() {
  auto attempt = startOnWorker(*queues_, [self = shared_from_this()] { return self->tryOut(); });
  if (attempt.wait_for(patience) != std::future_status::ready) {
    return captureError(CaptureErrorCode::DeviceTimedOut, format("%@ did not open within 5 seconds", {name_}));
  }
  LMRErrorRef error = attempt.get();
  open_ = open_ || !error;
  return error;
}

LMRErrorRef GStreamerDevice::tryOut() const {
  LMRErrorRef error;
  const CaptureSource source = makeSource(error);
  if (error) {
    return error;
  }
  const GstPtr<GstBus> bus(gst_bus_new());
  gst_element_set_bus(source.element.get(), bus.get());
  if (gst_element_set_state(source.element.get(), GST_STATE_READY) == GST_STATE_CHANGE_FAILURE) {
    const GstPtr<GstMessage> message(gst_bus_pop_filtered(bus.get(), GST_MESSAGE_ERROR));
    error = message ? deviceError(name_, *message)
                    : captureError(CaptureErrorCode::DeviceFailed, format("%@ does not open", {name_}));
  }
  gst_element_set_state(source.element.get(), GST_STATE_NULL);
  gst_element_set_bus(source.element.get(), nullptr);
  return error;
}

DeviceInput::DeviceInput(std::shared_ptr<GStreamerDevice> device)
    : SourceInput(device->mediaType()), device_(std::move(device)) {}

LMRErrorRef DeviceInput::check() const {
  return device_->isOpen() ? nullptr
                           : captureError(CaptureErrorCode::NotPossible,
                                          format("%@ has not been opened", {device_->localizedDisplayName()}));
}

std::string ScreenInput::name() const {
  return "screen:" + environment("DISPLAY");
}

LMRErrorRef ScreenInput::check() const {
  if (environment("DISPLAY").empty()) {
    return captureError(CaptureErrorCode::ScreenUnavailable, "There is no screen to capture");
  }
  return nullptr;
}

CaptureSource ScreenInput::makeSource(LMRErrorRef& error) const {
  error = check();
  CaptureSource source;
  source.element.reset(gst_element_factory_make("ximagesrc", nullptr));
  if (!source.element) {
    error = captureError(CaptureErrorCode::ScreenUnavailable, "The GStreamer plug-in ximagesrc is not installed");
    return source;
  }
  source.usesXServer = true;
  gst_object_ref_sink(source.element.get());
  g_object_set(source.element.get(), "use-damage", FALSE, nullptr);
  source.caps.reset(gst_caps_from_string(screenFormat));
  return source;
}

} // namespace lumora::backend
