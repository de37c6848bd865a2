#pragma once

#include <LumoraKit/platform/KTAction.h>

#include <deque>
#include <memory>

/// An action that runs other actions one after the other, in the order they were queued, telling each one's own
/// target as it ends. When all have succeeded it tells its finish target. The first that fails ends the queue: its
/// error becomes the queue's, the actions behind it are not run, and the queue tells its error target.
class LUMORA_EXPORT KTActionQueue final : public KTAction {
public:
  /// A new empty queue.
  static std::shared_ptr<KTActionQueue> queue();

  /// Appends an action. Before the start only.
  void queueAction(KTActionRef action);

private:
  KTActionQueue();
  void startExecution() override;
  bool executionBlocks() const override { return false; }
  void runNext();

  std::deque<KTActionRef> actions_;
};
