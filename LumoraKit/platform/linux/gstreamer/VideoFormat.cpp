#include <LumoraKit/platform/linux/gstreamer/VideoFormat.h>

#include <array>

namespace lumora::backend {
namespace {

constexpr int wantedWidth = 1280;
constexpr int wantedHeight = 720;
constexpr int wantedRate = 30;

GstPtr<GstCaps> fixate(GstPtr<GstCaps> caps) {
  GstStructure* const first = gst_caps_get_structure(caps.get(), 0);
  gst_structure_fixate_field_nearest_int(first, "width", wantedWidth);
  gst_structure_fixate_field_nearest_int(first, "height", wantedHeight);
  gst_structure_fixate_field_nearest_fraction(first, "framerate", wantedRate, 1);
  return GstPtr<GstCaps>(gst_caps_truncate(caps.release()));
}

int areaOf(const GstStructure& format) {
  int width = 0;
  int height = 0;
  gst_structure_get_int(&format, "width", &width);
  gst_structure_get_int(&format, "height", &height);
  return width * height;
}

// A camera lists its sizes one by one; each is fixed on its own and the largest one is taken.
GstPtr<GstCaps> largest(const GstCaps& formats) {
  GstPtr<GstCaps> best;
  for (guint i = 0; i < gst_caps_get_size(&formats); ++i) {
    auto candidate = fixate(GstPtr<GstCaps>(gst_caps_copy_nth(&formats, i)));
    const int area = areaOf(*gst_caps_get_structure(candidate.get(), 0));
    if (!best || area > areaOf(*gst_caps_get_structure(best.get(), 0))) {
      best = std::move(candidate);
    }
  }
  return best;
}

} // namespace

GstPtr<GstCaps> chooseVideoFormat(GstCaps& offered) {
  constexpr std::array wishes = {
      "video/x-raw, width=[1,1280], height=[1,720], framerate=30/1; "
      "image/jpeg, width=[1,1280], height=[1,720], framerate=30/1",
      "video/x-raw, framerate=[1/1,60/1]; image/jpeg, framerate=[1/1,60/1]",
      "video/x-raw; image/jpeg",
  };
  for (const char* const wish : wishes) {
    const GstPtr<GstCaps> wanted(gst_caps_from_string(wish));
    const GstPtr<GstCaps> both(gst_caps_intersect_full(wanted.get(), &offered, GST_CAPS_INTERSECT_FIRST));
    if (auto format = largest(*both)) {
      return format;
    }
  }
  return nullptr;
}

} // namespace lumora::backend
