#include "recorder/model/RoomForecast.h"

#include <algorithm>
#include <cmath>

namespace recorder {
namespace {

std::optional<double> secondsLeft(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  std::optional<double> least;
  for (const LMRDiskSpace& space : LMRDiskSpaceWatch::watchWithRecorder(recorder)->forecast()) {
    if (std::isfinite(space.secondsLeft())) {
      least = std::min(least.value_or(space.secondsLeft()), space.secondsLeft());
    }
  }
  return least;
}

} // namespace

void RoomForecast::refresh(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  if (isLooking_) {
    return;
  }
  isLooking_ = true;
  lumora::Platform::current().queues->concurrentQueue()->async([weak = weak_from_this(), recorder, look = look_] {
    const auto seconds = secondsLeft(recorder);
    lumora::Platform::current().queues->mainQueue()->async([weak, seconds, look] {
      if (const auto self = weak.lock()) {
        self->take(seconds, look);
      }
    });
  });
}

void RoomForecast::clear() {
  ++look_;
  isLooking_ = false;
  seconds_.reset();
}

void RoomForecast::take(std::optional<double> seconds, int look) {
  if (look == look_) {
    isLooking_ = false;
    seconds_ = seconds;
    changed.notify();
  }
}

} // namespace recorder
