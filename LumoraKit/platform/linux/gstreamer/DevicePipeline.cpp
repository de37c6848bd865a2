#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>
#include <LumoraKit/platform/linux/gstreamer/DelegateCall.h>
#include <LumoraKit/platform/linux/gstreamer/DevicePipeline.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>

#include <gst/app/gstappsink.h>
#include <gst/video/video.h>

namespace lumora::backend {
namespace {

constexpr std::chrono::seconds patience{2};
constexpr HostTime patienceTicks = std::chrono::nanoseconds(patience).count();

// A time stamp further than this from its arrival is of another clock.
constexpr HostTime plausibleAge = patienceTicks;
constexpr HostTime plausibleLead = 100'000'000;

// Samples that wait for a busy delegate, before the oldest is dropped: a second of video, two of sound.
constexpr guint videoSamplesInQueue = 30;
constexpr guint soundSamplesInQueue = 100;

GstElement* make(const char* factory) {
  return gst_element_factory_make(factory, nullptr);
}

GstElement* makeQueue(MediaType type) {
  GstElement* const queue = make("queue");
  const guint limit = type == MediaType::Video ? videoSamplesInQueue : soundSamplesInQueue;
  g_object_set(queue, "max-size-buffers", limit, "max-size-bytes", 0U, "max-size-time", guint64{0}, nullptr);
  gst_util_set_object_arg(G_OBJECT(queue), "leaky", "downstream");
  return queue;
}

GstElement* makeSink() {
  GstElement* const sink = make("appsink");
  g_object_set(sink, "sync", FALSE, "async", FALSE, "enable-last-sample", FALSE, nullptr);
  return sink;
}

bool isJpeg(GstCaps* caps) {
  return gst_structure_has_name(gst_caps_get_structure(caps, 0), "image/jpeg");
}

} // namespace

DevicePipeline::DevicePipeline(std::shared_ptr<SourceInput> input, std::shared_ptr<SampleSink> sink,
                               std::shared_ptr<Queues> queues)
    : input_(std::move(input)), connection_(input_->connection()), sink_(std::move(sink)), queues_(std::move(queues)) {}

// First of all: it reports its own end to the pipeline.
DevicePipeline::~DevicePipeline() {
  source_.support.reset();
}

LMRErrorRef DevicePipeline::start() {
  if (LMRErrorRef error = build()) {
    return error;
  }
  if (LMRErrorRef error = play()) {
    return error;
  }
  return awaitFirstSample();
}

LMRErrorRef DevicePipeline::build() {
  LMRErrorRef error;
  CaptureSource source = input_->makeSource(error);
  if (error) {
    return error;
  }
  GstPtr<GstElement> pipeline(gst_element_factory_make("pipeline", nullptr));
  gst_object_ref_sink(pipeline.get());
  GstElement* const queue = makeQueue(connection_->mediaType());
  GstElement* const sink = makeSink();
  const GstPtr<GstClock> clock(gst_system_clock_obtain());
  gst_pipeline_use_clock(GST_PIPELINE(pipeline.get()), clock.get());
  const std::lock_guard lock(stateMutex_);
  source_ = std::move(source);
  pipeline_ = std::move(pipeline);
  link(*queue, *sink);
  observe(*queue, *sink);
  return nullptr;
}

void DevicePipeline::link(GstElement& queue, GstElement& sink) {
  GstBin& bin = *GST_BIN(pipeline_.get());
  GstElement* const filter = make("capsfilter");
  g_object_set(filter, "caps", source_.caps.get(), nullptr);
  gst_bin_add_many(&bin, source_.element.get(), filter, &queue, &sink, nullptr);
  gst_element_link_many(source_.element.get(), filter, &queue, nullptr);
  if (isJpeg(source_.caps.get())) {
    GstElement* const decoder = make("jpegdec");
    gst_bin_add(&bin, decoder);
    gst_element_link_many(&queue, decoder, &sink, nullptr);
  } else {
    gst_element_link(&queue, &sink);
  }
}

void DevicePipeline::observe(GstElement& queue, GstElement& sink) {
  g_signal_connect(&queue, "overrun", G_CALLBACK(+[](GstElement*, gpointer self) {
    static_cast<DevicePipeline*>(self)->lost_.fetch_add(1, std::memory_order_relaxed);
  }),
                   this);
  GstAppSinkCallbacks callbacks{};
  callbacks.new_sample = [](GstAppSink* appSink, gpointer self) { return newSample(appSink, self); };
  gst_app_sink_set_callbacks(GST_APP_SINK(&sink), &callbacks, this, nullptr);
  const GstPtr<GstBus> bus(gst_element_get_bus(pipeline_.get()));
  gst_bus_set_sync_handler(bus.get(), &DevicePipeline::busMessage, this, nullptr);
  if (!source_.soundDevice.empty()) {
    g_signal_connect(
        source_.element.get(), "notify::current-device",
        G_CALLBACK(+[](GObject*, GParamSpec*, gpointer self) { static_cast<DevicePipeline*>(self)->deviceMoved(); }),
        this);
  }
}

LMRErrorRef DevicePipeline::play() {
  const std::lock_guard stateLock(stateMutex_);
  if (stopping_) {
    return captureError(CaptureErrorCode::DeviceFailed, format("%@ was stopped", {name()}));
  }
  if (setState(GST_STATE_PLAYING) != GST_STATE_CHANGE_FAILURE) {
    return nullptr;
  }
  const std::lock_guard lock(mutex_);
  return error_ ? error_ : captureError(CaptureErrorCode::DeviceFailed, format("%@ does not start", {name()}));
}

GstStateChangeReturn DevicePipeline::setState(GstState state) {
  std::optional<XServerLoss::Observation> observation;
  if (source_.usesXServer) {
    observation.emplace(serverLost());
  }
  return gst_element_set_state(pipeline_.get(), state);
}

LMRErrorRef DevicePipeline::awaitFirstSample() {
  std::unique_lock lock(mutex_);
  changed_.wait_for(lock, patience, [this] { return firstSampleCame_ || error_ || stopping_; });
  if (error_ || firstSampleCame_) {
    return error_;
  }
  return silenceError();
}

LMRErrorRef DevicePipeline::silenceError() const {
  return captureError(CaptureErrorCode::DeviceSilent, format("%@ gave no sample for 2 seconds", {name()}));
}

void DevicePipeline::stop() {
  {
    const std::lock_guard lock(mutex_);
    stopping_ = true;
  }
  changed_.notify_all();
  const std::lock_guard stateLock(stateMutex_);
  if (!pipeline_ || stuck_) {
    return;
  }
  setState(GST_STATE_NULL);
  source_.support.reset();
  if (const unsigned lost = lost_) {
    log("%@ was too busy: %u samples were lost", {name(), text(lost)});
  }
}

void DevicePipeline::checkForSilence() {
  const HostTime last = lastArrival_;
  if (last != 0 && hostTimeNow() > last + patienceTicks) {
    fail(silenceError());
  }
}

// Called on any thread, also the device's own: the rest happens on a worker, because those who are told may stop the
// device.
void DevicePipeline::fail(const LMRErrorRef& error) {
  if (stopping_ || failed_.exchange(true)) {
    return;
  }
  {
    const std::lock_guard lock(mutex_);
    error_ = error;
  }
  changed_.notify_all();
  startOnWorker(*queues_, [self = shared_from_this(), error] {
    log("Capture device failed: %@", {text(error)});
    self->connection_->setFailure(error);
    self->sink_->deviceFailed(self->connection_, error);
  });
}

// The sound server calls this on its own thread and holds its lock, so the name is read on a worker.
void DevicePipeline::deviceMoved() {
  startOnWorker(*queues_, [self = shared_from_this()] {
    GstPtr<gchar> now;
    g_object_get(self->source_.element.get(), "current-device", static_cast<gchar**>(GstOut(now)), nullptr);
    if (now && self->source_.soundDevice != now.get()) {
      self->fail(captureError(CaptureErrorCode::DeviceReplaced,
                              format("%@ was replaced by %@", {self->name(), std::string(now.get())})));
    }
  });
}

// The message is handled on the very thread that begins or ends.
void DevicePipeline::threadChanged(GstMessage& message) {
  GstStreamStatusType status = GST_STREAM_STATUS_TYPE_CREATE;
  gst_message_parse_stream_status(&message, &status, nullptr);
  if (source_.usesXServer && status == GST_STREAM_STATUS_TYPE_ENTER) {
    XServerLoss::observe(serverLost());
  } else if (source_.usesXServer && status == GST_STREAM_STATUS_TYPE_LEAVE) {
    XServerLoss::observeNoMore();
  }
}

XServerLoss::Observer DevicePipeline::serverLost() {
  return [weak = weak_from_this()] {
    auto self = weak.lock();
    if (self) {
      self->stuck_ = true;
      self->fail(captureError(CaptureErrorCode::DeviceFailed, format("The X server of %@ has ended", {self->name()})));
    }
    return self;
  };
}

GstFlowReturn DevicePipeline::newSample(GstAppSink* sink, gpointer self) {
  return static_cast<DevicePipeline*>(self)->pull(*sink);
}

GstFlowReturn DevicePipeline::pull(GstAppSink& sink) {
  const GstPtr<GstSample> sample(gst_app_sink_pull_sample(&sink));
  if (!sample) {
    return GST_FLOW_EOS;
  }
  noteArrival(*sample);
  if (connection_->isEnabled() && !failed_) {
    sink_->take(CapturedSample(*sample, timeOf(*sample)), connection_);
  }
  return GST_FLOW_OK;
}

HostTime DevicePipeline::timeOf(GstSample& sample) const {
  const HostTime now = hostTimeNow();
  const GstClockTime stamp = GST_BUFFER_PTS(gst_sample_get_buffer(&sample));
  if (!GST_CLOCK_TIME_IS_VALID(stamp)) {
    return now;
  }
  const GstClockTime running = gst_segment_to_running_time(gst_sample_get_segment(&sample), GST_FORMAT_TIME, stamp);
  const HostTime time = gst_element_get_base_time(pipeline_.get()) + running;
  return time + plausibleAge >= now && time <= now + plausibleLead ? time : now;
}

void DevicePipeline::noteArrival(GstSample& sample) {
  if (lastArrival_.exchange(hostTimeNow()) == 0) {
    GstVideoInfo info;
    if (connection_->mediaType() == MediaType::Video && gst_video_info_from_caps(&info, gst_sample_get_caps(&sample))) {
      connection_->setPictureSize({static_cast<std::uint32_t>(info.width), static_cast<std::uint32_t>(info.height)});
    }
    {
      const std::lock_guard lock(mutex_);
      firstSampleCame_ = true;
    }
    changed_.notify_all();
  }
}

GstBusSyncReply DevicePipeline::busMessage(GstBus*, GstMessage* message, gpointer pipeline) {
  auto& self = *static_cast<DevicePipeline*>(pipeline);
  if (GST_MESSAGE_TYPE(message) == GST_MESSAGE_ERROR) {
    self.fail(deviceError(self.name(), *message));
  } else if (GST_MESSAGE_TYPE(message) == GST_MESSAGE_EOS) {
    self.fail(captureError(CaptureErrorCode::DeviceFailed, format("%@ ended", {self.name()})));
  } else if (GST_MESSAGE_TYPE(message) == GST_MESSAGE_STREAM_STATUS) {
    self.threadChanged(*message);
  }
  gst_message_unref(message);
  return GST_BUS_DROP;
}

} // namespace lumora::backend
