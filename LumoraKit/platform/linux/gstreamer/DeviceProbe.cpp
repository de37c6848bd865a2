#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/DeviceProbe.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>

#include <algorithm>
#include <array>
#include <string_view>

namespace lumora::backend {
namespace {

constexpr std::chrono::seconds patience{4};

using Devices = std::vector<std::shared_ptr<GstDevice>>;

Devices probe(const char* providerName) {
  const GstPtr<GstDeviceProvider> provider(gst_device_provider_factory_get_by_name(providerName));
  Devices devices;
  if (!provider) {
    return devices;
  }
  GList* const list = gst_device_provider_get_devices(provider.get());
  for (GList* item = list; item; item = item->next) {
    devices.emplace_back(GST_DEVICE(item->data), GstRelease());
  }
  g_list_free(list);
  return devices;
}

GstPtr<GstStructure> propertiesOf(GstDevice& device) {
  GstPtr<GstStructure> properties(gst_device_get_properties(&device));
  return properties ? std::move(properties) : GstPtr<GstStructure>(gst_structure_new_empty("none"));
}

std::string property(const GstStructure& properties, const char* name) {
  const char* const value = gst_structure_get_string(&properties, name);
  return value ? value : "";
}

std::string displayName(GstDevice& device) {
  return GstPtr<gchar>(gst_device_get_display_name(&device)).get();
}

// What a camera is called by the kernel; by it, one that both PipeWire and V4L2 list is recognised.
std::string kernelPath(const GstStructure& properties) {
  for (const char* const name : {"api.v4l2.path", "device.path"}) {
    if (std::string path = property(properties, name); !path.empty()) {
      return path;
    }
  }
  return {};
}

void addSound(std::vector<ListedDevice>& result, const Devices& devices) {
  for (const auto& device : devices) {
    const auto properties = propertiesOf(*device);
    // A monitor plays back what the loudspeakers get.
    const bool isMonitor = property(*properties, "device.class") == "monitor";
    if (isMonitor || !gst_device_has_classes(device.get(), "Audio/Source")) {
      continue;
    }
    const std::string node = property(*properties, "node.name");
    const std::string name = displayName(*device);
    gboolean isDefault = FALSE;
    gst_structure_get_boolean(properties.get(), "is-default", &isDefault);
    result.push_back({"audio:" + (node.empty() ? name : node), name, MediaType::Sound, isDefault != FALSE, device});
  }
}

void addVideo(std::vector<ListedDevice>& result, std::vector<std::string>& paths, const Devices& devices) {
  for (const auto& device : devices) {
    const auto properties = propertiesOf(*device);
    const std::string path = kernelPath(*properties);
    if (!gst_device_has_classes(device.get(), "Video/Source") || std::ranges::count(paths, path) != 0) {
      continue;
    }
    if (!path.empty()) {
      paths.push_back(path);
    }
    const std::string node = property(*properties, "node.name");
    const std::string name = displayName(*device);
    result.push_back({"video:" + (node.empty() ? path : node), name, MediaType::Video, false, device});
  }
}

} // namespace

std::vector<ListedDevice> probeDevices(Queues& queues) {
  constexpr std::array providers{"pulsedeviceprovider", "pipewiredeviceprovider", "v4l2deviceprovider"};
  std::array<std::future<Devices>, providers.size()> answers;
  for (std::size_t i = 0; i < providers.size(); ++i) {
    answers[i] = startOnWorker(queues, [name = providers[i]] { return probe(name); });
  }
  std::vector<ListedDevice> result;
  std::vector<std::string> paths;
  const auto deadline = std::chrono::steady_clock::now() + patience;
  for (std::size_t i = 0; i < providers.size(); ++i) {
    if (answers[i].wait_until(deadline) != std::future_status::ready) {
      log("Capture: %@ does not answer", {std::string(providers[i])});
    } else if (i == 0) {
      addSound(result, answers[i].get());
    } else {
      addVideo(result, paths, answers[i].get());
    }
  }
  return result;
}

} // namespace lumora::backend
