#pragma once

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <optional>

namespace recorder {

/// How long can still be recorded before the disk is full. Main thread only.
class RoomForecast : public std::enable_shared_from_this<RoomForecast> {
public:
  /// Told when the seconds have been looked up.
  lumora::Notifier changed;

  /// Looks on a worker, for a recorder whose files have names.
  void refresh(const std::shared_ptr<LMRSourceRecorder>& recorder);
  /// Forgets what was looked up.
  void clear();
  /// Of the fullest disk; nothing when it is not known, or nothing is recorded on this machine.
  std::optional<double> seconds() const { return seconds_; }

private:
  void take(std::optional<double> seconds, int look);

  bool isLooking_ = false;
  // Which look this is: what an earlier one finds after a clear() does not count.
  int look_ = 0;
  std::optional<double> seconds_;
};

} // namespace recorder
