#pragma once

#include <LumoraKit/platform/linux/gstreamer/GstPtr.h>

#include <memory>
#include <string>

namespace lumora::backend {

/// What a device's pipeline begins with.
struct CaptureSource {
  /// What the element needs for as long as it runs; null when it needs nothing.
  std::shared_ptr<void> support;
  GstPtr<GstElement> element;
  /// What is asked of it.
  GstPtr<GstCaps> caps;
  /// For sound: the name by which the sound server knows the device; empty when it cannot be moved to another one.
  std::string soundDevice;
  /// Whether it talks to an X server.
  bool usesXServer = false;
};

} // namespace lumora::backend
