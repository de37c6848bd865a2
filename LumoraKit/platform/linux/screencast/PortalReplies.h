#pragma once

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/linux/GLibPtr.h>

#include <cstdint>
#include <optional>
#include <string>

/// \file
/// What the desktop's portal says, and what it is asked: the values of the interface
/// org.freedesktop.portal.ScreenCast. Nothing in a reply is believed unseen: what is missing or of another type counts
/// as not said.

namespace lumora::backend {

/// What a desktop's portal can do.
struct PortalFeatures {
  std::uint32_t version = 0;
  /// Whether it shows whole screens.
  bool offersScreens = false;
  /// Whether it can paint the pointer into the pictures.
  bool embedsPointer = false;

  /// Whether it gives a token for asking again without the user.
  bool remembersAnswers() const { return version >= 4; }

  friend bool operator==(const PortalFeatures&, const PortalFeatures&) = default;
};

/// From the properties of the interface, "a{sv}".
LUMORA_INTERNAL PortalFeatures portalFeatures(GVariant& properties);

/// The end of one request.
struct PortalResponse {
  std::uint32_t code = 0;
  GLibPtr<GVariant> results;
};

/// From the arguments of a Response signal; nothing when they are not those.
LUMORA_INTERNAL std::optional<PortalResponse> portalResponse(GVariant& arguments);

/// What the code of a response means: null for success.
LUMORA_INTERNAL LMRErrorRef portalRefusal(std::uint32_t code);

/// From the results of CreateSession; empty when there is no valid one.
LUMORA_INTERNAL std::string portalSessionHandle(GVariant& results);

/// From the results of Start: the PipeWire node of the first stream.
LUMORA_INTERNAL std::optional<std::uint32_t> portalStreamNode(GVariant& results);

/// From the results of Start; empty when the portal gave none.
LUMORA_INTERNAL std::string portalRestoreToken(GVariant& results);

/// The options of SelectSources, floating: one whole screen with the pointer in it, remembered while the application
/// runs, each where the portal can.
/// \param restoreToken what an earlier Start gave, or empty
LUMORA_INTERNAL GVariant* portalSourceOptions(const PortalFeatures& features, const std::string& handleToken,
                                              const std::string& restoreToken);

/// What a failed call of the portal means.
LUMORA_INTERNAL LMRErrorRef portalCallError(const GError& error);

/// The errors that have no reply.
LUMORA_INTERNAL LMRErrorRef screenError(CaptureErrorCode code, std::string text);
LUMORA_INTERNAL LMRErrorRef portalTimedOut();
LUMORA_INTERNAL LMRErrorRef portalEnded();
LUMORA_INTERNAL LMRErrorRef sessionBusLost();
LUMORA_INTERNAL LMRErrorRef screensNotOffered();

} // namespace lumora::backend
