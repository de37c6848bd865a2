#pragma once

#include <functional>
#include <memory>
#include <utility>

namespace lumora::backend {

/// Xlib ends the whole process when a call finds that the X server is gone, and has no way back to the caller of a
/// connection that is not one's own. So a thread that has registered here is told and then stops for good; other
/// threads are left to the handler that was there before.
class XServerLoss {
public:
  /// What it returns is kept alive, for the thread's sake.
  using Observer = std::function<std::shared_ptr<const void>()>;

  /// From now on, on this thread: `lost` is called inside the call that finds the server gone.
  static void observe(Observer lost);
  static void observeNoMore();

  /// Registers the thread for as long as the object lives.
  class Observation {
  public:
    explicit Observation(Observer lost) { observe(std::move(lost)); }
    Observation(const Observation&) = delete;
    Observation& operator=(const Observation&) = delete;
    ~Observation() { observeNoMore(); }
  };
};

} // namespace lumora::backend
