#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/MediaCapture.h>

#include <cstdint>
#include <memory>
#include <optional>

/// Shows the pictures of a capture session, whether anything is recorded or not.
///
///     LMRErrorRef error;
///     auto preview = LMRVideoPreview::previewWithCaptureSession_error(session, &error);
///     ...                                                         // some times a second
///     if (const auto picture = preview->takePicture(320, 180)) { ... picture->rgb ... }
///
/// Any thread. A picture is converted only when one was asked for: as long as nobody takes any, the preview costs
/// nothing but a look at a flag for every sample. The conversion is done on the camera's thread.
class LUMORA_EXPORT LMRVideoPreview {
public:
  /// Joins the session with an output of its own, which records nothing, and leaves it when it dies.
  /// \return null, with the error set, when the session takes no further output
  /// \param error may be null
  static std::unique_ptr<LMRVideoPreview>
  previewWithCaptureSession_error(const std::shared_ptr<lumora::CaptureSession>& session, LMRErrorRef* error);

  LMRVideoPreview(const LMRVideoPreview&) = delete;
  LMRVideoPreview& operator=(const LMRVideoPreview&) = delete;
  ~LMRVideoPreview();

  /// The picture that was captured next after the last call, in its own proportions within the size that the last call
  /// asked for; nothing when none has come. Asks for the next one. A picture is never made larger than it was captured.
  /// \param maximumWidth,maximumHeight in pixels, at least 1 each
  std::optional<lumora::Picture> takePicture(std::uint32_t maximumWidth, std::uint32_t maximumHeight);

private:
  class Listener;

  LMRVideoPreview(std::shared_ptr<lumora::CaptureSession> session, std::shared_ptr<lumora::MovieFileOutput> output,
                  std::shared_ptr<Listener> listener);

  const std::shared_ptr<lumora::CaptureSession> session_;
  const std::shared_ptr<lumora::MovieFileOutput> output_;
  const std::shared_ptr<Listener> listener_;
};
