#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/gstreamer/DelegateCall.h>
#include <LumoraKit/platform/linux/gstreamer/Inputs.h>
#include <LumoraKit/platform/linux/gstreamer/PortalScreenInput.h>
#include <LumoraKit/platform/linux/gstreamer/Session.h>
#include <LumoraKit/platform/linux/screencast/ScreenSystem.h>

#include <algorithm>
#include <mutex>

namespace lumora::backend {
namespace {

// GStreamer is initialised when it is needed first: a program that only talks to a server never loads a plug-in.
class GStreamerCapture final : public MediaCapture {
public:
  explicit GStreamerCapture(std::shared_ptr<Queues> queues)
      : queues_(std::move(queues)), catalog_(std::make_shared<DeviceCatalog>(queues_)),
        encoders_(std::make_shared<Encoders>(queues_)), portal_(std::make_shared<ScreenCastPortal>(queues_)) {}

  std::shared_ptr<CaptureDevice> defaultInputDevice(MediaType type) override {
    const std::vector<ListedDevice> devices = list(type);
    const auto marked = std::ranges::find_if(devices, &ListedDevice::isDefault);
    if (marked != devices.end()) {
      return makeDevice(*marked);
    }
    // For video the system names none.
    return devices.empty() ? nullptr : makeDevice(devices.front());
  }

  std::vector<std::shared_ptr<CaptureDevice>> inputDevices(MediaType type) override {
    std::vector<std::shared_ptr<CaptureDevice>> result;
    for (const ListedDevice& device : list(type)) {
      result.push_back(makeDevice(device));
    }
    return result;
  }

  std::shared_ptr<CaptureDevice> deviceWithUniqueID(const std::string& uniqueID) override {
    initialize();
    const auto device = catalog_->find(uniqueID);
    return device ? makeDevice(*device) : nullptr;
  }

  std::shared_ptr<CaptureInput> makeDeviceInput(const std::shared_ptr<CaptureDevice>& device) override {
    const auto own = std::dynamic_pointer_cast<GStreamerDevice>(device);
    return own ? std::make_shared<DeviceInput>(own) : nullptr;
  }

  std::shared_ptr<CaptureInput> makeScreenInput() override {
    initialize();
    if (screenSystemOf(DesktopEnvironment::current()) == ScreenSystem::Portal) {
      return std::make_shared<PortalScreenInput>(portal_);
    }
    return std::make_shared<ScreenInput>();
  }

  std::shared_ptr<CaptureSession> makeSession() override { return std::make_shared<Session>(queues_); }

  std::shared_ptr<MovieFileOutput> makeMovieFileOutput() override {
    initialize();
    return std::make_shared<FileOutput>(queues_, encoders_);
  }

  HostTime hostTime() const override { return hostTimeNow(); }

  std::vector<MediaEncoder> encoders(const std::string& codec) override {
    initialize();
    return encoders_->list(codec);
  }

private:
  static void initialize() {
    static std::once_flag once;
    std::call_once(once, [] { gst_init(nullptr, nullptr); });
  }

  std::vector<ListedDevice> list(MediaType type) {
    initialize();
    return catalog_->devices(type);
  }

  std::shared_ptr<CaptureDevice> makeDevice(const ListedDevice& device) {
    return std::make_shared<GStreamerDevice>(device, catalog_, queues_);
  }

  const std::shared_ptr<Queues> queues_;
  const std::shared_ptr<DeviceCatalog> catalog_;
  const std::shared_ptr<Encoders> encoders_;
  const std::shared_ptr<ScreenCastPortal> portal_;
};

} // namespace

std::shared_ptr<MediaCapture> makeMediaCapture(std::shared_ptr<Queues> queues) {
  return std::make_shared<GStreamerCapture>(std::move(queues));
}

} // namespace lumora::backend
