#include "MovieFacts.h"

#include <gst/pbutils/pbutils.h>

#include <memory>

namespace lumora::tests {
namespace {

struct Unref {
  void operator()(gpointer object) const { g_object_unref(object); }
};

int count(GList* streams) {
  const auto length = static_cast<int>(g_list_length(streams));
  gst_discoverer_stream_info_list_free(streams);
  return length;
}

} // namespace

MovieFacts movieFacts(const std::filesystem::path& file) {
  gst_init(nullptr, nullptr);
  const std::unique_ptr<GstDiscoverer, Unref> discoverer(gst_discoverer_new(30 * GST_SECOND, nullptr));
  const std::string uri = "file://" + file.string();
  const std::unique_ptr<GstDiscovererInfo, Unref> info(
      gst_discoverer_discover_uri(discoverer.get(), uri.c_str(), nullptr));
  if (!info || gst_discoverer_info_get_result(info.get()) != GST_DISCOVERER_OK) {
    return {};
  }
  return {static_cast<double>(gst_discoverer_info_get_duration(info.get())) / GST_SECOND,
          count(gst_discoverer_info_get_video_streams(info.get())),
          count(gst_discoverer_info_get_audio_streams(info.get()))};
}

} // namespace lumora::tests
