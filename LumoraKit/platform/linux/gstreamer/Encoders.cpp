#include <LumoraKit/platform/linux/gstreamer/Encoders.h>
#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>

#include <array>
#include <string_view>

namespace lumora::backend {
namespace {

constexpr std::chrono::seconds patience{3};

// In the order of preference. The delays of the sound encoders were measured with clicks. Without scenecut: each key
// picture ends a fragment of the file, and a restless picture would make a dozen a second.
constexpr std::array candidates{
    Encoder{"h264", MediaType::Video, "vah264enc",
            "vah264enc b-frames=0 key-int-max=GOP bitrate=KBITS ! video/x-h264,profile=high ! h264parse", "NV12", 0},
    Encoder{"h264", MediaType::Video, "nvh264enc",
            "nvh264enc zerolatency=true gop-size=GOP bitrate=KBITS ! video/x-h264,profile=high ! h264parse", "NV12", 0},
    Encoder{"h264", MediaType::Video, "x264enc",
            "x264enc speed-preset=superfast tune=zerolatency key-int-max=GOP option-string=scenecut=0 bitrate=KBITS ! "
            "video/x-h264,profile=high ! h264parse",
            "I420", 0},
    Encoder{"h264", MediaType::Video, "openh264enc", "openh264enc complexity=low gop-size=GOP bitrate=BITS ! h264parse",
            "I420", 0},
    Encoder{"mjpeg", MediaType::Video, "jpegenc", "jpegenc", "I420", 0},
    Encoder{"aac", MediaType::Sound, "avenc_aac", "avenc_aac bitrate=BITS ! aacparse", "F32LE", 1024},
    Encoder{"aac", MediaType::Sound, "voaacenc", "voaacenc bitrate=BITS ! aacparse", "S16LE", 1600},
    Encoder{"pcm", MediaType::Sound, "", "identity", "S16LE", 0},
};

void replace(std::string& text, std::string_view word, std::uint32_t number) {
  if (const auto at = text.find(word); at != std::string::npos) {
    text.replace(at, word.size(), std::to_string(number));
  }
}

std::string trialLine(const Encoder& encoder) {
  const std::string source = encoder.type == MediaType::Video
                                 ? "videotestsrc num-buffers=2 ! video/x-raw,width=320,height=240,framerate=30/1 ! "
                                   "videoconvertscale"
                                 : "audiotestsrc num-buffers=4 ! audio/x-raw,rate=48000,channels=2 ! audioconvert";
  return source + " ! " + encoder.launchLine(128'000, 30) + " ! fakesink";
}

bool runsToItsEnd(const std::string& line) {
  GstPtr<GError> error;
  const GstPtr<GstElement> pipeline(gst_parse_launch(line.c_str(), GstOut(error)));
  if (!pipeline || error) {
    return false;
  }
  const GstPtr<GstBus> bus(gst_element_get_bus(pipeline.get()));
  gst_element_set_state(pipeline.get(), GST_STATE_PLAYING);
  const auto limit = static_cast<GstClockTime>(std::chrono::nanoseconds(patience).count());
  const auto outcomes = static_cast<GstMessageType>(GST_MESSAGE_EOS | GST_MESSAGE_ERROR);
  const GstPtr<GstMessage> outcome(gst_bus_timed_pop_filtered(bus.get(), limit, outcomes));
  gst_element_set_state(pipeline.get(), GST_STATE_NULL);
  return outcome && GST_MESSAGE_TYPE(outcome.get()) == GST_MESSAGE_EOS;
}

} // namespace

std::string Encoder::launchLine(std::uint32_t bitRate, std::uint32_t keyInterval) const {
  std::string line = launch;
  replace(line, "KBITS", bitRate / 1000);
  replace(line, "BITS", bitRate);
  replace(line, "GOP", keyInterval);
  return line;
}

const Encoder* Encoders::find(MediaType type, const std::string& codec) {
  const std::lock_guard lock(mutex_);
  if (const auto known = found_.find(codec); known != found_.end()) {
    return known->second && known->second->type == type ? known->second : nullptr;
  }
  for (const Encoder& encoder : candidates) {
    if (encoder.type == type && encoder.codec == codec && tryOut(encoder)) {
      return found_[codec] = &encoder;
    }
  }
  return nullptr;
}

bool Encoders::tryOut(const Encoder& encoder) const {
  const std::string_view element = encoder.element;
  if (element.empty()) {
    return true;
  }
  const GstPtr<GstElementFactory> factory(gst_element_factory_find(encoder.element));
  if (!factory) {
    return false;
  }
  // A driver may hang: the trial is given up then.
  auto trial = startOnWorker(*queues_, [line = trialLine(encoder)] { return runsToItsEnd(line); });
  return trial.wait_for(patience) == std::future_status::ready && trial.get();
}

} // namespace lumora::backend
