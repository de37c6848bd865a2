#include <LumoraKit/platform/linux/gstreamer/DelegateCall.h>

#include <ctime>

namespace lumora::backend {
namespace {

thread_local DelegateCall* current = nullptr;

} // namespace

HostTime hostTimeNow() {
  timespec time{};
  clock_gettime(CLOCK_MONOTONIC, &time);
  return static_cast<HostTime>(time.tv_sec) * 1'000'000'000 + static_cast<HostTime>(time.tv_nsec);
}

DelegateCall::DelegateCall(std::optional<HostTime> sampleTime) : outer_(current), sampleTime_(sampleTime) {
  current = this;
}

DelegateCall::~DelegateCall() {
  current = outer_;
}

bool DelegateCall::isCurrent() {
  return current != nullptr;
}

HostTime DelegateCall::requestTime() {
  return current && current->sampleTime_ ? *current->sampleTime_ : hostTimeNow();
}

} // namespace lumora::backend
