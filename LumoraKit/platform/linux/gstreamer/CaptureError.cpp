#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>

namespace lumora::backend {
namespace {

struct Report {
  GstPtr<GError> error;
  GstPtr<gchar> debug;
};

Report parse(GstMessage& message) {
  Report report;
  gst_message_parse_error(&message, GstOut(report.error), GstOut(report.debug));
  return report;
}

// The last line of the debug text holds the cause ("system error: No space left on device"), the ones above it the
// place in the source.
std::string describe(const Report& report) {
  const std::string debug = report.debug ? report.debug.get() : "";
  const auto lastLine = debug.rfind('\n');
  std::string text = report.error->message;
  return lastLine == std::string::npos ? text : text + " (" + debug.substr(lastLine + 1) + ")";
}

CaptureErrorCode codeOf(const GError& error) {
  if (error.domain != GST_RESOURCE_ERROR) {
    return CaptureErrorCode::EncodingFailed;
  }
  return error.code == GST_RESOURCE_ERROR_NO_SPACE_LEFT ? CaptureErrorCode::DiskFull
                                                        : CaptureErrorCode::FileNotWritable;
}

} // namespace

LMRErrorRef captureError(CaptureErrorCode code, std::string text) {
  return LMRError::make(LMRCaptureErrorDomain, static_cast<std::int64_t>(code), std::move(text));
}

LMRErrorRef deviceError(const std::string& device, GstMessage& message) {
  return captureError(CaptureErrorCode::DeviceFailed, format("%@: %@", {device, describe(parse(message))}));
}

LMRErrorRef recordingError(GstMessage& message) {
  const Report report = parse(message);
  return captureError(codeOf(*report.error), describe(report));
}

} // namespace lumora::backend
