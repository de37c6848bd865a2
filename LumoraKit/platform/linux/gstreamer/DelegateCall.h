#pragma once

#include <LumoraKit/platform/MediaCapture.h>

namespace lumora::backend {

/// The host clock now.
HostTime hostTimeNow();

/// Marks the calling thread as being inside a message to an output's delegate. A request that is made there refers to
/// the message's sample, and must not wait for the devices' threads: this may be one of them.
class DelegateCall {
public:
  /// `sampleTime`: of the sample that the message shows, if it shows one.
  explicit DelegateCall(std::optional<HostTime> sampleTime);
  DelegateCall(const DelegateCall&) = delete;
  DelegateCall& operator=(const DelegateCall&) = delete;
  ~DelegateCall();

  /// Whether the caller is inside a message.
  static bool isCurrent();
  /// The moment that a request refers to: the sample's time inside its message, otherwise now.
  static HostTime requestTime();

private:
  DelegateCall* outer_;
  std::optional<HostTime> sampleTime_;
};

} // namespace lumora::backend
