#pragma once

#include <LumoraKit/platform/Observable.h>

#include <any>
#include <atomic>
#include <functional>
#include <memory>
#include <mutex>
#include <utility>
#include <vector>

/// \file
/// The list behind notifiers and the notification centre: of the framework's own, not for applications.

namespace lumora::detail {

struct Observer {
  std::function<void(const std::any& object)> told;
  std::atomic<bool> isConnected{true};
};

struct Observers : std::enable_shared_from_this<Observers> {
  Connection add(std::function<void(const std::any& object)> told);
  void remove(const std::shared_ptr<Observer>& observer);
  /// Calls, without a lock held, everybody who was on the list at the call and still is when the turn comes.
  void tell(const std::any& object);

private:
  std::mutex mutex_;
  std::vector<std::shared_ptr<Observer>> list_;
};

} // namespace lumora::detail
