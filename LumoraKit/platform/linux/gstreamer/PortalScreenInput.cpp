#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>
#include <LumoraKit/platform/linux/gstreamer/PortalScreenInput.h>
#include <LumoraKit/platform/linux/screencast/ScreenSystem.h>

namespace lumora::backend {
namespace {

// With the 2 seconds for a first sample it makes the 5 seconds that opening a device may take.
constexpr std::chrono::seconds patience{3};

// A desktop sends a picture when something has changed: the last one is repeated meanwhile, so that a screen at rest
// gives samples too.
constexpr int millisecondsToRepeat = 33;
constexpr const char* description = "pipewiresrc name=screen ! videorate skip-to-first=true";
constexpr const char* screenFormat = "video/x-raw, framerate=30/1";

GstPtr<GstElement> makeElement(const ScreenStream& stream) {
  GstPtr<GstElement> bin(
      gst_parse_bin_from_description_full(description, TRUE, nullptr, GST_PARSE_FLAG_FATAL_ERRORS, nullptr));
  if (!bin) {
    return nullptr;
  }
  gst_object_ref_sink(bin.get());
  const GstPtr<GstElement> source(gst_bin_get_by_name(GST_BIN(bin.get()), "screen"));
  // The element uses a duplicate of the descriptor. Held buffers would stop the screen for good.
  g_object_set(source.get(), "fd", stream.remote, "path", std::to_string(stream.node).c_str(), "do-timestamp", TRUE,
               "always-copy", TRUE, "keepalive-time", millisecondsToRepeat, nullptr);
  return bin;
}

// The end of the screen becomes an error of the element that shows it, for as long as there is one.
ScreenCast::EndHandler failing(GstElement& element) {
  const std::shared_ptr<GWeakRef> weak(new GWeakRef, [](GWeakRef* reference) {
    g_weak_ref_clear(reference);
    delete reference;
  });
  g_weak_ref_init(weak.get(), &element);
  return [weak](const LMRErrorRef& error) {
    const GstPtr<GstElement> alive(static_cast<GstElement*>(g_weak_ref_get(weak.get())));
    if (alive) {
      GST_ELEMENT_ERROR(alive.get(), RESOURCE, READ, ("%s", error->localizedDescription().c_str()), (nullptr));
    }
  };
}

} // namespace

std::string PortalScreenInput::name() const {
  return "screen:" + DesktopEnvironment::current().waylandDisplay;
}

std::shared_ptr<ScreenCast> PortalScreenInput::requested() const {
  const std::lock_guard lock(mutex_);
  if (!requested_) {
    requested_ = portal_->open();
  }
  return requested_;
}

void PortalScreenInput::forget(const std::shared_ptr<ScreenCast>& screen) const {
  const std::lock_guard lock(mutex_);
  if (requested_ == screen) {
    requested_.reset();
  }
}

CaptureSource PortalScreenInput::makeSource(LMRErrorRef& error) const {
  const std::shared_ptr<ScreenCast> screen = requested();
  const auto stream = screen->await(patience, error);
  if (stream || !screen->isAsking()) {
    forget(screen);
  }
  CaptureSource source;
  if (!stream) {
    return source;
  }
  source.element = makeElement(*stream);
  if (!source.element) {
    error = captureError(CaptureErrorCode::ScreenUnavailable,
                         "The GStreamer plug-ins pipewiresrc and videorate are not installed");
    return source;
  }
  screen->whenEnded(failing(*source.element));
  source.support = screen;
  source.caps.reset(gst_caps_from_string(screenFormat));
  return source;
}

void PortalScreenInput::withdraw() {
  const std::lock_guard lock(mutex_);
  if (requested_) {
    requested_->close();
    requested_.reset();
  }
}

} // namespace lumora::backend
