#include <LumoraKit/platform/linux/gstreamer/BitRate.h>
#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>
#include <LumoraKit/platform/linux/gstreamer/RecordingPipeline.h>

#include <gst/video/video.h>

namespace lumora::backend {
namespace {

// Every 0.8 s a fragment is completed, so that a file whose writer died can be played up to there. The muxer's other
// mode, which turns the fragments into one index at the end, is of no use: it leaves out the size of a sample that is
// as large as its fragment's first one, and then a reader gives up the whole file unless it was finished.
// Unbuffered: what is written is with the kernel at once.
constexpr const char* container = "qtmux name=mux fragment-duration=800 fragment-mode=dash-or-mss ! "
                                  "filesink name=file async=false buffer-mode=unbuffered";
constexpr const char* source =
    " appsrc name=%NAME format=time is-live=true block=false max-bytes=0 max-buffers=0 max-time=0 ! ";
constexpr const char* toMuxer = " ! queue max-size-time=0 max-size-bytes=0 max-size-buffers=0 ! mux.";

constexpr auto outcomes = static_cast<GstMessageType>(GST_MESSAGE_EOS | GST_MESSAGE_ERROR);

std::string sourceName(std::size_t track) {
  return "track" + std::to_string(track);
}

// A key picture begins each fragment. The picture that the encoder gets is fixed, whatever happens to the camera's
// format: a change would spoil the file.
std::string videoLine(const TrackFormat& track) {
  GstVideoInfo info;
  gst_video_info_from_caps(&info, track.caps.get());
  const PictureSize captured{static_cast<std::uint32_t>(info.width), static_cast<std::uint32_t>(info.height)};
  const PictureSize size = encodedSize(track.options, captured);
  const std::uint32_t bitRate = wantedBitRate(MediaType::Video, track.options, captured);
  const auto framesASecond =
      info.fps_n > 0 ? static_cast<std::uint32_t>((info.fps_n + info.fps_d / 2) / info.fps_d) : 30;
  const bool isRgb = GST_VIDEO_INFO_IS_RGB(&info);
  const GstPtr<gchar> colorimetry(isRgb ? nullptr : gst_video_colorimetry_to_string(&info.colorimetry));
  return std::string("videoconvertscale ! video/x-raw,pixel-aspect-ratio=1/1,format=") + track.encoder->rawFormat +
         ",width=" + std::to_string(size.width) + ",height=" + std::to_string(size.height) +
         ",colorimetry=" + (colorimetry ? colorimetry.get() : GST_VIDEO_COLORIMETRY_BT709) + " ! " +
         track.encoder->launchLine(bitRate, std::max(framesASecond * 4 / 5, 1U));
}

std::string soundLine(const TrackFormat& track) {
  return std::string("audioconvert ! audioresample ! audio/x-raw,format=") + track.encoder->rawFormat +
         ",rate=48000,channels=2 ! " + track.encoder->launchLine(wantedBitRate(MediaType::Sound, track.options, {}), 0);
}

std::string launchLine(const std::vector<TrackFormat>& tracks) {
  std::string line = container;
  for (std::size_t i = 0; i < tracks.size(); ++i) {
    std::string begin = source;
    begin.replace(begin.find("%NAME"), 5, sourceName(i));
    const bool isVideo = tracks[i].encoder->type == MediaType::Video;
    line += begin + (isVideo ? videoLine(tracks[i]) : soundLine(tracks[i])) + toMuxer;
  }
  return line;
}

} // namespace

RecordingPipeline::RecordingPipeline(const std::filesystem::path& file, const std::vector<TrackFormat>& tracks) {
  pipeline_.reset(gst_parse_launch(launchLine(tracks).c_str(), GstOut(parseError_)));
  if (!pipeline_ || parseError_) {
    return;
  }
  GstBin* const bin = GST_BIN(pipeline_.get());
  const GstPtr<GstElement> sink(gst_bin_get_by_name(bin, "file"));
  g_object_set(sink.get(), "location", file.c_str(), nullptr);
  for (std::size_t i = 0; i < tracks.size(); ++i) {
    sources_.emplace_back(gst_bin_get_by_name(bin, sourceName(i).c_str()));
  }
  const GstPtr<GstClock> clock(gst_system_clock_obtain());
  gst_pipeline_use_clock(GST_PIPELINE(bin), clock.get());
  bus_.reset(gst_element_get_bus(pipeline_.get()));
}

RecordingPipeline::~RecordingPipeline() {
  if (pipeline_) {
    gst_element_set_state(pipeline_.get(), GST_STATE_NULL);
  }
}

LMRErrorRef RecordingPipeline::start() {
  if (!bus_) {
    return captureError(CaptureErrorCode::EncodingFailed, parseError_->message);
  }
  if (gst_element_set_state(pipeline_.get(), GST_STATE_PLAYING) != GST_STATE_CHANGE_FAILURE) {
    return nullptr;
  }
  const auto outcome = awaitEnd(std::chrono::milliseconds(200));
  return outcome && outcome->error
             ? outcome->error
             : captureError(CaptureErrorCode::EncodingFailed, "The recording pipeline does not start");
}

void RecordingPipeline::push(std::size_t track, GstSample& sample) {
  gst_app_src_push_sample(GST_APP_SRC(sources_[track].get()), &sample);
}

void RecordingPipeline::endOfStream(std::size_t track) {
  gst_app_src_end_of_stream(GST_APP_SRC(sources_[track].get()));
}

std::uint64_t RecordingPipeline::waitingBytes(std::size_t track) const {
  return gst_app_src_get_current_level_bytes(GST_APP_SRC(sources_[track].get()));
}

std::optional<RecordingPipeline::Outcome> RecordingPipeline::awaitEnd(std::chrono::milliseconds limit) {
  const auto ticks = static_cast<GstClockTime>(std::chrono::nanoseconds(limit).count());
  const GstPtr<GstMessage> message(gst_bus_timed_pop_filtered(bus_.get(), ticks, outcomes));
  if (!message) {
    return std::nullopt;
  }
  return Outcome{GST_MESSAGE_TYPE(message.get()) == GST_MESSAGE_ERROR ? recordingError(*message) : nullptr};
}

} // namespace lumora::backend
