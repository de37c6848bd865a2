#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/screencast/PortalReplies.h>

#include <utility>

namespace lumora::backend {
namespace {

// Bits of the interface.
constexpr std::uint32_t wholeScreens = 1;
constexpr std::uint32_t embeddedPointer = 2;
// As long as the application runs.
constexpr std::uint32_t rememberTransiently = 1;

enum Response : std::uint32_t { Success = 0, RefusedByUser = 1 };

std::uint32_t number(GVariant& dictionary, const char* key) {
  std::uint32_t value = 0;
  g_variant_lookup(&dictionary, key, "u", &value);
  return value;
}

GLibPtr<GVariant> lookUp(GVariant& dictionary, const char* key, const char* type) {
  return GLibPtr<GVariant>(g_variant_lookup_value(&dictionary, key, G_VARIANT_TYPE(type)));
}

void add(GVariantBuilder& options, const char* key, GVariant* value) {
  g_variant_builder_add(&options, "{sv}", key, value);
}

LMRErrorRef busError(const GError& error, const std::string& reason) {
  switch (error.code) {
  case G_DBUS_ERROR_NO_REPLY:
    return portalEnded();
  case G_DBUS_ERROR_TIMEOUT:
  case G_DBUS_ERROR_TIMED_OUT:
    return portalTimedOut();
  case G_DBUS_ERROR_SERVICE_UNKNOWN:
  case G_DBUS_ERROR_NAME_HAS_NO_OWNER:
  case G_DBUS_ERROR_SPAWN_SERVICE_NOT_FOUND:
    return screenError(CaptureErrorCode::ScreenUnavailable,
                       "There is no desktop portal that could show the screen: " + reason);
  // The answers to a question about an interface that is not there.
  case G_DBUS_ERROR_INVALID_ARGS:
  case G_DBUS_ERROR_UNKNOWN_INTERFACE:
  case G_DBUS_ERROR_UNKNOWN_METHOD:
  case G_DBUS_ERROR_UNKNOWN_OBJECT:
    return screensNotOffered();
  default:
    return screenError(CaptureErrorCode::DeviceFailed, "The desktop's portal does not show the screen: " + reason);
  }
}

} // namespace

LMRErrorRef screenError(CaptureErrorCode code, std::string text) {
  return LMRError::make(LMRCaptureErrorDomain, static_cast<std::int64_t>(code), std::move(text));
}

LMRErrorRef portalTimedOut() {
  return screenError(CaptureErrorCode::DeviceTimedOut, "The desktop's portal did not answer in time");
}

LMRErrorRef portalEnded() {
  return screenError(CaptureErrorCode::DeviceFailed, "The desktop's portal has ended");
}

LMRErrorRef sessionBusLost() {
  return screenError(CaptureErrorCode::DeviceFailed, "The connection to the session bus was lost");
}

LMRErrorRef screensNotOffered() {
  return screenError(CaptureErrorCode::ScreenUnavailable, "The desktop's portal does not offer screens");
}

PortalFeatures portalFeatures(GVariant& properties) {
  if (g_variant_is_of_type(&properties, G_VARIANT_TYPE_VARDICT) == FALSE) {
    return {};
  }
  return {number(properties, "version"), (number(properties, "AvailableSourceTypes") & wholeScreens) != 0,
          (number(properties, "AvailableCursorModes") & embeddedPointer) != 0};
}

std::optional<PortalResponse> portalResponse(GVariant& arguments) {
  if (g_variant_is_of_type(&arguments, G_VARIANT_TYPE("(ua{sv})")) == FALSE) {
    return std::nullopt;
  }
  const GLibPtr<GVariant> code(g_variant_get_child_value(&arguments, 0));
  return PortalResponse{g_variant_get_uint32(code.get()), GLibPtr<GVariant>(g_variant_get_child_value(&arguments, 1))};
}

LMRErrorRef portalRefusal(std::uint32_t code) {
  if (code == Success) {
    return nullptr;
  }
  return code == RefusedByUser
             ? screenError(CaptureErrorCode::ScreenRefused, "The user did not allow the screen to be recorded")
             : screenError(CaptureErrorCode::DeviceFailed, "The desktop ended the question for a screen by itself");
}

// Some portals send it as a plain text.
std::string portalSessionHandle(GVariant& results) {
  for (const char* const type : {"s", "o"}) {
    if (const auto handle = lookUp(results, "session_handle", type)) {
      const char* const path = g_variant_get_string(handle.get(), nullptr);
      return g_variant_is_object_path(path) != FALSE ? path : "";
    }
  }
  return {};
}

std::optional<std::uint32_t> portalStreamNode(GVariant& results) {
  const auto streams = lookUp(results, "streams", "a(ua{sv})");
  if (!streams || g_variant_n_children(streams.get()) == 0) {
    return std::nullopt;
  }
  const GLibPtr<GVariant> first(g_variant_get_child_value(streams.get(), 0));
  const GLibPtr<GVariant> node(g_variant_get_child_value(first.get(), 0));
  return g_variant_get_uint32(node.get());
}

std::string portalRestoreToken(GVariant& results) {
  const auto token = lookUp(results, "restore_token", "s");
  return token ? g_variant_get_string(token.get(), nullptr) : "";
}

GVariant* portalSourceOptions(const PortalFeatures& features, const std::string& handleToken,
                              const std::string& restoreToken) {
  GVariantBuilder options;
  g_variant_builder_init(&options, G_VARIANT_TYPE_VARDICT);
  add(options, "handle_token", g_variant_new_string(handleToken.c_str()));
  add(options, "types", g_variant_new_uint32(wholeScreens));
  add(options, "multiple", g_variant_new_boolean(FALSE));
  if (features.embedsPointer) {
    add(options, "cursor_mode", g_variant_new_uint32(embeddedPointer));
  }
  if (features.remembersAnswers()) {
    add(options, "persist_mode", g_variant_new_uint32(rememberTransiently));
    if (!restoreToken.empty()) {
      add(options, "restore_token", g_variant_new_string(restoreToken.c_str()));
    }
  }
  return g_variant_builder_end(&options);
}

LMRErrorRef portalCallError(const GError& error) {
  const GLibPtr<GError> plain(g_error_copy(&error));
  g_dbus_error_strip_remote_error(plain.get());
  if (error.domain == G_DBUS_ERROR) {
    return busError(error, plain->message);
  }
  switch (error.domain == G_IO_ERROR ? error.code : G_IO_ERROR_FAILED) {
  case G_IO_ERROR_TIMED_OUT:
    return portalTimedOut();
  case G_IO_ERROR_CLOSED:
    return sessionBusLost();
  default:
    return screenError(CaptureErrorCode::DeviceFailed,
                       format("The desktop's portal does not show the screen: %@", {plain->message}));
  }
}

} // namespace lumora::backend
