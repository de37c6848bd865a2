#include "BareMicrophone.h"

#include "Light.h"
#include "PipeWire.h"

#include <array>
#include <cstdint>
#include <cstdio>
#include <cstdlib>

namespace lumora::bench {
namespace {

constexpr HostTime second = 1'000'000'000;
constexpr HostTime rate = 48'000;

} // namespace

struct BareMicrophone::Stream {
  BareMicrophone& owner;
  pw_thread_loop* thread = nullptr;
  pw_stream* stream = nullptr;

  // Within the cycle that brought the sound, whose time is that of its end.
  static void process(void* data) {
    auto& self = *static_cast<Stream*>(data);
    pw_time time{};
    pw_stream_get_time_n(self.stream, &time, sizeof time);
    if (pw_buffer* const buffer = pw_stream_dequeue_buffer(self.stream)) {
      const spa_data& sound = buffer->buffer->datas[0];
      const auto* const samples = static_cast<const float*>(sound.data) + sound.chunk->offset / sizeof(float);
      self.owner.listen({samples, samples + sound.chunk->size / sizeof(float)}, static_cast<HostTime>(time.now));
      pw_stream_queue_buffer(self.stream, buffer);
    }
  }
};

BareMicrophone::BareMicrophone() : stream_(std::make_unique<Stream>(Stream{*this})) {
  static const pw_stream_events events = [] {
    pw_stream_events result{};
    result.version = PW_VERSION_STREAM_EVENTS;
    result.process = Stream::process;
    return result;
  }();
  pw_init(nullptr, nullptr);
  stream_->thread = pw_thread_loop_new("bare microphone", nullptr);
  stream_->stream = pw_stream_new_simple(pw_thread_loop_get_loop(stream_->thread), "bare microphone",
                                         pw_properties_new(PW_KEY_MEDIA_TYPE, "Audio", PW_KEY_MEDIA_CATEGORY, "Capture",
                                                           PW_KEY_TARGET_OBJECT, "lumora_microphone", nullptr),
                                         &events, stream_.get());
  std::array<std::uint8_t, 1024> bytes{};
  spa_pod_builder builder{};
  spa_pod_builder_init(&builder, bytes.data(), static_cast<std::uint32_t>(bytes.size()));
  spa_audio_info_raw format{};
  format.format = SPA_AUDIO_FORMAT_F32;
  format.rate = rate;
  format.channels = 1;
  std::array<const spa_pod*, 1> offer{spa_format_audio_raw_build(&builder, SPA_PARAM_EnumFormat, &format)};
  const auto flags =
      static_cast<pw_stream_flags>(PW_STREAM_FLAG_AUTOCONNECT | PW_STREAM_FLAG_MAP_BUFFERS | PW_STREAM_FLAG_RT_PROCESS);
  if (pw_stream_connect(stream_->stream, PW_DIRECTION_INPUT, PW_ID_ANY, flags, offer.data(), offer.size()) < 0 ||
      pw_thread_loop_start(stream_->thread) < 0) {
    std::fprintf(stderr, "The bare microphone does not start\n");
    std::exit(EXIT_FAILURE);
  }
}

BareMicrophone::~BareMicrophone() {
  pw_thread_loop_stop(stream_->thread);
  pw_stream_destroy(stream_->stream);
  pw_thread_loop_destroy(stream_->thread);
}

// A beep lasts longer than it takes to be recognised: only its first time counts.
void BareMicrophone::listen(const std::vector<float>& samples, HostTime end) {
  for (std::size_t i = 0; i < samples.size(); ++i) {
    const HostTime at = end - (samples.size() - i + BeepFinder::lag) * second / rate;
    if (finder_.feed(samples[i]) && light::age(at) < light::length) {
      const std::lock_guard lock(mutex_);
      delays_.try_emplace(at - light::age(at), static_cast<double>(light::age(at)) / 1e9);
    }
  }
}

std::map<HostTime, double> BareMicrophone::delays() const {
  const std::lock_guard lock(mutex_);
  return delays_;
}

} // namespace lumora::bench
