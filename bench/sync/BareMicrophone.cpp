#include "BareMicrophone.h"

#include "Light.h"

#include <gst/app/gstappsink.h>

#include <cstdint>

namespace lumora::bench {

BareMicrophone::BareMicrophone() {
  gst_init(nullptr, nullptr);
  pipeline_ = gst_parse_launch("pulsesrc device=lumora_microphone provide-clock=false latency-time=10000 ! "
                               "audio/x-raw,format=S16LE,rate=48000,channels=1 ! appsink name=sink sync=false",
                               nullptr);
  GstClock* const clock = gst_system_clock_obtain();
  gst_pipeline_use_clock(GST_PIPELINE(pipeline_), clock);
  gst_object_unref(clock);
  GstElement* const sink = gst_bin_get_by_name(GST_BIN(pipeline_), "sink");
  GstAppSinkCallbacks callbacks{};
  callbacks.new_sample = [](GstAppSink* appSink, gpointer self) {
    GstSample* const sample = gst_app_sink_pull_sample(appSink);
    if (sample) {
      static_cast<BareMicrophone*>(self)->listen(*sample);
      gst_sample_unref(sample);
    }
    return GST_FLOW_OK;
  };
  gst_app_sink_set_callbacks(GST_APP_SINK(sink), &callbacks, this, nullptr);
  gst_object_unref(sink);
  gst_element_set_state(pipeline_, GST_STATE_PLAYING);
}

BareMicrophone::~BareMicrophone() {
  gst_element_set_state(pipeline_, GST_STATE_NULL);
  gst_object_unref(pipeline_);
}

// A beep lasts longer than it takes to be recognised: only its first time counts.
void BareMicrophone::listen(GstSample& sample) {
  GstBuffer* const buffer = gst_sample_get_buffer(&sample);
  const HostTime time = gst_element_get_base_time(pipeline_) + GST_BUFFER_PTS(buffer);
  GstMapInfo map;
  gst_buffer_map(buffer, &map, GST_MAP_READ);
  const auto* const frames = reinterpret_cast<const std::int16_t*>(map.data);
  for (std::size_t i = 0; i < map.size / sizeof *frames; ++i) {
    const HostTime at = time + i * 1'000'000'000 / 48'000 - BeepFinder::lag * 1'000'000'000 / 48'000;
    if (finder_.feed(frames[i] / 32'768.0) && light::age(at) < light::length) {
      const std::lock_guard lock(mutex_);
      delays_.try_emplace(at - light::age(at), static_cast<double>(light::age(at)) / 1e9);
    }
  }
  gst_buffer_unmap(buffer, &map);
}

std::map<HostTime, double> BareMicrophone::delays() const {
  const std::lock_guard lock(mutex_);
  return delays_;
}

} // namespace lumora::bench
