#pragma once

#include <LumoraKit/platform/linux/gstreamer/Inputs.h>
#include <LumoraKit/platform/linux/screencast/ScreenCastPortal.h>

namespace lumora::backend {

/// A screen of a Wayland desktop, as its portal shows it, 30 times a second. The user is asked by the first
/// makeSource(), which waits for 3 seconds; while the dialog is open, another one waits for the same answer.
class PortalScreenInput final : public SourceInput {
public:
  explicit PortalScreenInput(std::shared_ptr<ScreenCastPortal> portal)
      : SourceInput(MediaType::Video), portal_(std::move(portal)) {}

  std::shared_ptr<CaptureDevice> device() const override { return nullptr; }
  std::string name() const override;
  LMRErrorRef check() const override { return portal_->check(); }
  CaptureSource makeSource(LMRErrorRef& error) const override;
  void withdraw() override;

private:
  std::shared_ptr<ScreenCast> requested() const;
  void forget(const std::shared_ptr<ScreenCast>& screen) const;

  const std::shared_ptr<ScreenCastPortal> portal_;
  mutable std::mutex mutex_;
  // The screen that the user was asked for, until a source was made of it.
  mutable std::shared_ptr<ScreenCast> requested_;
};

} // namespace lumora::backend
