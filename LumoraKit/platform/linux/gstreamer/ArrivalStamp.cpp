#include <LumoraKit/platform/linux/gstreamer/ArrivalStamp.h>
#include <LumoraKit/platform/linux/gstreamer/DelegateCall.h>
#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>
#include <LumoraKit/platform/linux/gstreamer/SoundClock.h>

#include <algorithm>

namespace lumora::backend {
namespace {

GstPadProbeReturn stamp(GstPad* pad, GstPadProbeInfo* info, gpointer clock) {
  GstBuffer* const buffer = gst_buffer_make_writable(GST_PAD_PROBE_INFO_BUFFER(info));
  const GstPtr<GstElement> source(gst_pad_get_parent_element(pad));
  const HostTime baseTime = gst_element_get_base_time(source.get());
  const std::uint64_t begin = GST_BUFFER_PTS(buffer);
  const HostTime time =
      static_cast<SoundClock*>(clock)->captureTime(begin, begin + GST_BUFFER_DURATION(buffer), hostTimeNow());
  // What was captured before the pipeline ran comes first, and is too early for any recording.
  GST_BUFFER_PTS(buffer) = std::max(time, baseTime) - baseTime;
  GST_PAD_PROBE_INFO_DATA(info) = buffer;
  return GST_PAD_PROBE_OK;
}

} // namespace

void stampByArrival(GstElement& source) {
  const GstPtr<GstPad> pad(gst_element_get_static_pad(&source, "src"));
  gst_pad_add_probe(pad.get(), GST_PAD_PROBE_TYPE_BUFFER, stamp, new SoundClock,
                    [](gpointer clock) { delete static_cast<SoundClock*>(clock); });
}

} // namespace lumora::backend
