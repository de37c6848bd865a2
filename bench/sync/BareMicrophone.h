#pragma once

#include "BeepFinder.h"

#include <LumoraKit/platform/MediaCapture.h>

#include <gst/gst.h>

#include <map>
#include <mutex>

namespace lumora::bench {

/// Listens to the headless microphone beside the recorder, with nothing but the sound server's own source: how late it
/// has the beeps is the way through the sound server, of which the recorder knows nothing.
class BareMicrophone {
public:
  BareMicrophone();
  BareMicrophone(const BareMicrophone&) = delete;
  BareMicrophone& operator=(const BareMicrophone&) = delete;
  ~BareMicrophone();

  /// In seconds, by the host time at which the beep began.
  std::map<HostTime, double> delays() const;

private:
  void listen(GstSample& sample);

  GstElement* pipeline_;
  mutable std::mutex mutex_;
  std::map<HostTime, double> delays_;
  BeepFinder finder_;
};

} // namespace lumora::bench
