#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/Encoders.h>
#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>

#include <algorithm>
#include <array>
#include <string_view>

namespace lumora::backend {
namespace {

constexpr std::chrono::seconds patience{3};

// In the order of preference. The delays of the sound encoders were measured with clicks. Without scenecut: each key
// picture ends a fragment of the file, and a restless picture would make a dozen a second.
constexpr std::array candidates{
    Encoder{"h264", MediaType::Video, "vah264enc", "VA-API", true,
            "vah264enc b-frames=0 key-int-max=GOP bitrate=KBITS ! video/x-h264,profile=high ! h264parse", "NV12", 0},
    Encoder{"h264", MediaType::Video, "nvh264enc", "NVENC", true,
            "nvh264enc zerolatency=true gop-size=GOP bitrate=KBITS ! video/x-h264,profile=high ! h264parse", "NV12", 0},
    Encoder{"h264", MediaType::Video, "x264enc", "x264", false,
            "x264enc speed-preset=superfast tune=zerolatency key-int-max=GOP option-string=scenecut=0 bitrate=KBITS ! "
            "video/x-h264,profile=high ! h264parse",
            "I420", 0},
    Encoder{"h264", MediaType::Video, "openh264enc", "OpenH264", false,
            "openh264enc complexity=low gop-size=GOP bitrate=BITS ! h264parse", "I420", 0},
    Encoder{"mjpeg", MediaType::Video, "jpegenc", "JPEG", false, "jpegenc", "I420", 0},
    Encoder{"aac", MediaType::Sound, "avenc_aac", "libavcodec", false, "avenc_aac bitrate=BITS ! aacparse", "F32LE",
            1024},
    Encoder{"aac", MediaType::Sound, "voaacenc", "VisualOn", false, "voaacenc bitrate=BITS ! aacparse", "S16LE", 1600},
    Encoder{"pcm", MediaType::Sound, "", "PCM", false, "identity", "S16LE", 0},
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

const Encoder* Encoders::find(MediaType type, const std::string& codec, const std::optional<std::string>& wanted) {
  const auto fits = [&](const Encoder& each) { return each.type == type && each.codec == codec; };
  if (wanted) {
    const auto* const named =
        std::ranges::find_if(candidates, [&](const Encoder& each) { return fits(each) && each.element == *wanted; });
    if (named != candidates.end() && works(*named)) {
      return named;
    }
    log("The encoder %@ does not work here, another one is taken", {*wanted});
  }
  const auto* const first =
      std::ranges::find_if(candidates, [&](const Encoder& each) { return fits(each) && works(each); });
  if (first != candidates.end()) {
    return first;
  }
  forgetFailures();
  return nullptr;
}

std::vector<MediaEncoder> Encoders::list(const std::string& codec) {
  std::vector<MediaEncoder> working;
  for (const Encoder& each : candidates) {
    if (each.codec == codec && works(each)) {
      working.push_back({each.element, each.name, each.isHardware});
    }
  }
  return working;
}

// The lock is held for one trial only: a recording that is about to begin does not wait for the end of a list.
bool Encoders::works(const Encoder& encoder) {
  const std::lock_guard lock(mutex_);
  const auto known = tried_.find(&encoder);
  return known != tried_.end() ? known->second : tried_.emplace(&encoder, tryOut(encoder)).first->second;
}

// Where none works the moment may have been to blame: the next recording tries again.
void Encoders::forgetFailures() {
  const std::lock_guard lock(mutex_);
  std::erase_if(tried_, [](const auto& each) { return !each.second; });
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
