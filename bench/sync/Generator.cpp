#include "Generator.h"

#include "Camera.h"
#include "Light.h"

#include <gst/app/gstappsrc.h>
#include <gst/gst.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <numbers>
#include <random>
#include <string>
#include <thread>
#include <vector>

namespace lumora::bench {
namespace {

// Where the light is in the picture; the rest is texture that moves, for the encoder to have its usual work.
constexpr std::size_t lampWidth = 256;
constexpr std::size_t lampHeight = 192;

HostTime now() {
  return gst_util_get_timestamp();
}

void sleepUntil(HostTime time) {
  const timespec until{static_cast<time_t>(time / 1'000'000'000), static_cast<long>(time % 1'000'000'000)};
  while (clock_nanosleep(CLOCK_MONOTONIC, TIMER_ABSTIME, &until, nullptr) != 0) {
  }
}

std::uint8_t luma(double level) {
  return static_cast<std::uint8_t>(std::lround(16 + 219 * level));
}

// A pipeline "appsrc name=source ! ..." whose time stamps are host times.
GstAppSrc* start(const std::string& description) {
  GError* error = nullptr;
  GstElement* const pipeline = gst_parse_launch(description.c_str(), &error);
  if (error) {
    std::fprintf(stderr, "%s\n", error->message);
    return nullptr;
  }
  GstClock* const clock = gst_system_clock_obtain();
  gst_pipeline_use_clock(GST_PIPELINE(pipeline), clock);
  gst_object_unref(clock);
  gst_element_set_start_time(pipeline, GST_CLOCK_TIME_NONE);
  gst_element_set_base_time(pipeline, 0);
  gst_element_set_state(pipeline, GST_STATE_PLAYING);
  return GST_APP_SRC(gst_bin_get_by_name(GST_BIN(pipeline), "source"));
}

GstBuffer* bufferOf(const void* data, std::size_t size, HostTime time) {
  GstBuffer* const buffer = gst_buffer_new_memdup(data, size);
  GST_BUFFER_PTS(buffer) = time;
  return buffer;
}

// The lamp, and texture that moves upwards.
class Painter {
public:
  Painter() : texture_(Camera::stride * Camera::height, 128) {
    std::minstd_rand random(1);
    for (std::size_t i = 0; i < texture_.size(); i += 2) {
      texture_[i] = static_cast<std::uint8_t>(60 + i / Camera::stride / 8 + i % Camera::stride / 32 + random() % 12);
    }
  }

  void operator()(std::uint8_t* pixels, HostTime time) const {
    const std::size_t shift = time / Camera::interval * 2 % Camera::height;
    const std::size_t split = (Camera::height - shift) * Camera::stride;
    std::memcpy(pixels, &texture_[shift * Camera::stride], split);
    std::memcpy(pixels + split, texture_.data(), texture_.size() - split);
    const std::uint8_t level = luma(light::level(time));
    for (std::size_t row = 0; row < lampHeight; ++row) {
      for (std::size_t column = 0; column < lampWidth; ++column) {
        pixels[row * Camera::stride + 2 * column] = level;
      }
    }
  }

private:
  std::vector<std::uint8_t> texture_;
};

// A window in the corner of the screen, drawn anew every 4 ms while the light changes.
void runScreen() {
  GstAppSrc* const source = start("appsrc name=source is-live=true format=time caps=video/x-raw,format=GRAY8,width=256,"
                                  "height=192,framerate=0/1 ! videoconvert ! ximagesink sync=false");
  if (!source) {
    return;
  }
  double shown = -1;
  for (HostTime time = now();; time += 4'000'000) {
    sleepUntil(time);
    const double level = light::level(now());
    if (level != shown) {
      const std::vector<std::uint8_t> pixels(lampWidth * lampHeight, static_cast<std::uint8_t>(255 * level));
      gst_app_src_push_buffer(source, bufferOf(pixels.data(), pixels.size(), time));
      shown = level;
    }
  }
}

// The sound is known beforehand: it is handed over early, and the sink plays it at its time.
void runBeep() {
  constexpr std::uint64_t rate = 48'000;
  constexpr std::size_t frames = 4800;
  GstAppSrc* const source =
      start("appsrc name=source format=time block=true max-bytes=192000 caps=audio/x-raw,format=S16LE,rate=48000,"
            "channels=1,layout=interleaved ! pulsesink device=lumora_tone provide-clock=false slave-method=none "
            "buffer-time=1000000 latency-time=50000");
  std::array<std::int16_t, frames> samples{};
  for (std::uint64_t position = (now() / 1'000'000'000 + 1) * rate; source; position += frames) {
    for (std::size_t i = 0; i < frames; ++i) {
      const std::uint64_t at = position + i;
      const HostTime time = at / rate * 1'000'000'000 + at % rate * 1'000'000'000 / rate;
      const double wave = std::sin(2 * std::numbers::pi * 4000 * static_cast<double>(at % rate) / rate);
      samples[i] = static_cast<std::int16_t>(light::isBeeping(time) ? 12'000 * wave : 0);
    }
    const HostTime time = position / rate * 1'000'000'000 + position % rate * 1'000'000'000 / rate;
    if (gst_app_src_push_buffer(source, bufferOf(samples.data(), sizeof samples, time)) != GST_FLOW_OK) {
      return;
    }
  }
}

} // namespace

int generate() {
  gst_init(nullptr, nullptr);
  // Four tenths of the interval apart.
  const Camera left(leftCamera, 0, Painter());
  const Camera right(rightCamera, Camera::interval * 4 / 10, Painter());
  std::thread screen(runScreen);
  runBeep();
  screen.join();
  return 1;
}

} // namespace lumora::bench
