#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>
#include <LumoraKit/platform/linux/gstreamer/PictureConversion.h>

#include <gst/video/video.h>

#include <algorithm>
#include <memory>

namespace lumora::backend {
namespace {

using Converter = std::unique_ptr<GstVideoConverter, decltype(&gst_video_converter_free)>;

// A frame that is mapped for as long as this lives.
class MappedFrame {
public:
  MappedFrame(GstVideoInfo& info, GstBuffer* buffer)
      : isMapped_(buffer && gst_video_frame_map(&frame_, &info, buffer, GST_MAP_READ) != FALSE) {}
  MappedFrame(const MappedFrame&) = delete;
  MappedFrame& operator=(const MappedFrame&) = delete;
  ~MappedFrame() {
    if (isMapped_) {
      gst_video_frame_unmap(&frame_);
    }
  }

  const GstVideoFrame* get() const { return isMapped_ ? &frame_ : nullptr; }

private:
  GstVideoFrame frame_{};
  bool isMapped_;
};

Converter makeConverter(GstVideoInfo& from, GstVideoInfo& to) {
  GstStructure* const options =
      gst_structure_new("options", GST_VIDEO_CONVERTER_OPT_RESAMPLER_METHOD, GST_TYPE_VIDEO_RESAMPLER_METHOD,
                        GST_VIDEO_RESAMPLER_METHOD_LINEAR, GST_VIDEO_CONVERTER_OPT_DITHER_METHOD,
                        GST_TYPE_VIDEO_DITHER_METHOD, GST_VIDEO_DITHER_NONE, nullptr);
  return {gst_video_converter_new(&from, &to, options), &gst_video_converter_free};
}

// Rows of GStreamer's are a multiple of four bytes.
Picture withoutGaps(const GstVideoFrame& frame, PictureSize size) {
  const std::size_t length = std::size_t{size.width} * 3;
  Picture picture{size.width, size.height, std::vector<std::uint8_t>(length * size.height)};
  const auto* row = static_cast<const std::uint8_t*>(GST_VIDEO_FRAME_PLANE_DATA(&frame, 0));
  const auto stride = static_cast<std::size_t>(GST_VIDEO_FRAME_PLANE_STRIDE(&frame, 0));
  for (std::size_t y = 0; y < size.height; ++y) {
    std::copy_n(row + y * stride, length, picture.rgb.begin() + static_cast<std::ptrdiff_t>(y * length));
  }
  return picture;
}

} // namespace

PictureSize fittedSize(PictureSize captured, PictureSize maximum) {
  const double width = std::max(maximum.width, 1U);
  const double height = std::max(maximum.height, 1U);
  const double scale = std::min({1.0, width / captured.width, height / captured.height});
  return {std::max(1U, static_cast<std::uint32_t>(captured.width * scale)),
          std::max(1U, static_cast<std::uint32_t>(captured.height * scale))};
}

std::optional<Picture> convertedPicture(GstSample& sample, PictureSize maximum) {
  GstVideoInfo from;
  GstCaps* const caps = gst_sample_get_caps(&sample);
  if (!gst_structure_has_name(gst_caps_get_structure(caps, 0), "video/x-raw") ||
      gst_video_info_from_caps(&from, caps) == FALSE) {
    return std::nullopt;
  }
  const PictureSize size = fittedSize({static_cast<std::uint32_t>(GST_VIDEO_INFO_WIDTH(&from)),
                                       static_cast<std::uint32_t>(GST_VIDEO_INFO_HEIGHT(&from))},
                                      maximum);
  GstVideoInfo to;
  gst_video_info_set_format(&to, GST_VIDEO_FORMAT_RGB, size.width, size.height);
  to.fps_n = from.fps_n;
  to.fps_d = from.fps_d;
  const MappedFrame source(from, gst_sample_get_buffer(&sample));
  const GstPtr<GstBuffer> buffer(gst_buffer_new_allocate(nullptr, GST_VIDEO_INFO_SIZE(&to), nullptr));
  const Converter converter = makeConverter(from, to);
  if (!source.get() || !converter) {
    return std::nullopt;
  }
  GstVideoFrame target;
  if (gst_video_frame_map(&target, &to, buffer.get(), GST_MAP_READWRITE) == FALSE) {
    return std::nullopt;
  }
  gst_video_converter_frame(converter.get(), source.get(), &target);
  Picture picture = withoutGaps(target, size);
  gst_video_frame_unmap(&target);
  return picture;
}

} // namespace lumora::backend
