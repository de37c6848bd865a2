#pragma once

#include <LumoraKit/platform/Queues.h>

#include <future>
#include <memory>
#include <utility>

namespace lumora::backend {

/// Runs work that may block for long on a thread of its own. The future may be dropped: the work goes on.
template <class Work> auto startOnWorker(Queues& queues, Work work) {
  using Result = decltype(work());
  auto task = std::make_shared<std::packaged_task<Result()>>(std::move(work));
  queues.concurrentQueue()->async([task] { (*task)(); });
  return task->get_future();
}

} // namespace lumora::backend
