#include "Camera.h"

#include "PipeWire.h"

#include <array>
#include <cstdio>
#include <cstdlib>
#include <ctime>

namespace lumora::bench {
namespace {

HostTime now() {
  timespec time{};
  clock_gettime(CLOCK_MONOTONIC, &time);
  return static_cast<HostTime>(time.tv_sec) * 1'000'000'000 + static_cast<HostTime>(time.tv_nsec);
}

class Parameters {
public:
  Parameters() { spa_pod_builder_init(&builder_, bytes_.data(), static_cast<std::uint32_t>(bytes_.size())); }

  const spa_pod* format() {
    const spa_rectangle size{Camera::width, Camera::height};
    const spa_fraction rate{30, 1};
    return static_cast<const spa_pod*>(spa_pod_builder_add_object(
        &builder_, SPA_TYPE_OBJECT_Format, SPA_PARAM_EnumFormat, SPA_FORMAT_mediaType, SPA_POD_Id(SPA_MEDIA_TYPE_video),
        SPA_FORMAT_mediaSubtype, SPA_POD_Id(SPA_MEDIA_SUBTYPE_raw), SPA_FORMAT_VIDEO_format,
        SPA_POD_Id(SPA_VIDEO_FORMAT_YUY2), SPA_FORMAT_VIDEO_size, SPA_POD_Rectangle(&size), SPA_FORMAT_VIDEO_framerate,
        SPA_POD_Fraction(&rate)));
  }

  const spa_pod* buffers() {
    return static_cast<const spa_pod*>(spa_pod_builder_add_object(
        &builder_, SPA_TYPE_OBJECT_ParamBuffers, SPA_PARAM_Buffers, SPA_PARAM_BUFFERS_buffers,
        SPA_POD_CHOICE_RANGE_Int(8, 4, 16), SPA_PARAM_BUFFERS_blocks, SPA_POD_Int(1), SPA_PARAM_BUFFERS_size,
        SPA_POD_Int(static_cast<int>(Camera::stride * Camera::height)), SPA_PARAM_BUFFERS_stride,
        SPA_POD_Int(static_cast<int>(Camera::stride))));
  }

  const spa_pod* header() {
    return static_cast<const spa_pod*>(spa_pod_builder_add_object(
        &builder_, SPA_TYPE_OBJECT_ParamMeta, SPA_PARAM_Meta, SPA_PARAM_META_type, SPA_POD_Id(SPA_META_Header),
        SPA_PARAM_META_size, SPA_POD_Int(static_cast<int>(sizeof(spa_meta_header)))));
  }

private:
  std::array<std::uint8_t, 1024> bytes_{};
  spa_pod_builder builder_{};
};

} // namespace

struct Camera::Stream {
  Painter painter;
  HostTime phase = 0;
  HostTime next = 0;
  pw_thread_loop* thread = nullptr;
  pw_stream* stream = nullptr;
  spa_source* timer = nullptr;

  void setTimer() const {
    timespec time{static_cast<time_t>(next / 1'000'000'000), static_cast<long>(next % 1'000'000'000)};
    pw_loop_update_timer(pw_thread_loop_get_loop(thread), timer, &time, nullptr, true);
  }

  static void stateChanged(void* data, pw_stream_state, pw_stream_state state, const char*) {
    auto& self = *static_cast<Stream*>(data);
    if (state == PW_STREAM_STATE_STREAMING) {
      self.next = (now() / interval + 1) * interval + self.phase;
      self.setTimer();
    }
  }

  static void parameterChanged(void* data, std::uint32_t id, const spa_pod* parameter) {
    if (id == SPA_PARAM_Format && parameter) {
      Parameters parameters;
      std::array<const spa_pod*, 2> answer{parameters.buffers(), parameters.header()};
      pw_stream_update_params(static_cast<Stream*>(data)->stream, answer.data(), answer.size());
    }
  }

  static void timeReached(void* data, std::uint64_t) {
    auto& self = *static_cast<Stream*>(data);
    if (pw_stream_get_state(self.stream, nullptr) == PW_STREAM_STATE_STREAMING) {
      pw_stream_trigger_process(self.stream);
    }
  }

  static void process(void* data) {
    auto& self = *static_cast<Stream*>(data);
    if (pw_buffer* const buffer = pw_stream_dequeue_buffer(self.stream)) {
      self.fill(*buffer->buffer);
      pw_stream_queue_buffer(self.stream, buffer);
    } else {
      std::fprintf(stderr, "bench-sync: a camera had no room for a picture\n");
    }
    self.next += interval;
    self.setTimer();
  }

  void fill(spa_buffer& buffer) const {
    spa_data& data = buffer.datas[0];
    if (!data.data) {
      return;
    }
    painter(static_cast<std::uint8_t*>(data.data), next);
    data.chunk->offset = 0;
    data.chunk->size = stride * height;
    data.chunk->stride = stride;
    if (void* const meta = spa_buffer_find_meta_data(&buffer, SPA_META_Header, sizeof(spa_meta_header))) {
      static_cast<spa_meta_header*>(meta)->pts = static_cast<std::int64_t>(next);
    }
  }
};

Camera::Camera(const std::string& name, HostTime phase, Painter painter) : stream_(std::make_unique<Stream>()) {
  static const pw_stream_events events = [] {
    pw_stream_events result{};
    result.version = PW_VERSION_STREAM_EVENTS;
    result.state_changed = Stream::stateChanged;
    result.param_changed = Stream::parameterChanged;
    result.process = Stream::process;
    return result;
  }();
  pw_init(nullptr, nullptr);
  stream_->painter = std::move(painter);
  stream_->phase = phase;
  stream_->thread = pw_thread_loop_new(name.c_str(), nullptr);
  pw_loop* const loop = pw_thread_loop_get_loop(stream_->thread);
  stream_->timer = pw_loop_add_timer(loop, Stream::timeReached, stream_.get());
  stream_->stream = pw_stream_new_simple(loop, name.c_str(),
                                         pw_properties_new(PW_KEY_MEDIA_CLASS, "Video/Source", PW_KEY_MEDIA_ROLE,
                                                           "Camera", PW_KEY_NODE_NAME, name.c_str(),
                                                           PW_KEY_NODE_DESCRIPTION, name.c_str(), nullptr),
                                         &events, stream_.get());
  Parameters parameters;
  std::array<const spa_pod*, 1> offer{parameters.format()};
  const auto flags = static_cast<pw_stream_flags>(PW_STREAM_FLAG_DRIVER | PW_STREAM_FLAG_MAP_BUFFERS);
  if (pw_stream_connect(stream_->stream, PW_DIRECTION_OUTPUT, PW_ID_ANY, flags, offer.data(), offer.size()) < 0 ||
      pw_thread_loop_start(stream_->thread) < 0) {
    std::fprintf(stderr, "bench-sync: the camera %s does not start\n", name.c_str());
    std::exit(EXIT_FAILURE);
  }
}

Camera::~Camera() {
  pw_thread_loop_stop(stream_->thread);
  pw_stream_destroy(stream_->stream);
  pw_thread_loop_destroy(stream_->thread);
}

} // namespace lumora::bench
