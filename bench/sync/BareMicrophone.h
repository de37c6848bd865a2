#pragma once

#include "BeepFinder.h"

#include <LumoraKit/platform/MediaCapture.h>

#include <map>
#include <memory>
#include <mutex>
#include <vector>

namespace lumora::bench {

/// Listens to the headless microphone beside the recorder, as a bare client of PipeWire and by PipeWire's own times:
/// how late it has the beeps is their way to the microphone, of which a recorder can know nothing.
class BareMicrophone {
public:
  BareMicrophone();
  BareMicrophone(const BareMicrophone&) = delete;
  BareMicrophone& operator=(const BareMicrophone&) = delete;
  ~BareMicrophone();

  /// In seconds, by the host time at which the beep began.
  std::map<HostTime, double> delays() const;

private:
  struct Stream;

  void listen(const std::vector<float>& samples, HostTime end);

  std::unique_ptr<Stream> stream_;
  mutable std::mutex mutex_;
  std::map<HostTime, double> delays_;
  BeepFinder finder_;
};

} // namespace lumora::bench
