#include <LumoraKit/platform/linux/GLibThread.h>
#include <LumoraKit/platform/linux/ThreadPool.h>

#include <utility>

namespace lumora::backend {

struct GLibThread::Loop {
  void run() const {
    g_main_context_push_thread_default(context.get());
    while (!hasEnded) {
      g_main_context_iteration(context.get(), TRUE);
    }
    g_main_context_pop_thread_default(context.get());
  }

  const GLibPtr<GMainContext> context{g_main_context_new()};
  TaskSource tasks{context.get()};
  // Of the thread alone.
  bool hasEnded = false;
};

std::unique_ptr<GLibThread> GLibThread::start() {
  auto loop = std::make_shared<Loop>();
  return startThread([loop] { loop->run(); }) ? std::unique_ptr<GLibThread>(new GLibThread(std::move(loop))) : nullptr;
}

GLibThread::GLibThread(std::shared_ptr<Loop> loop) : loop_(std::move(loop)) {}

GLibThread::~GLibThread() {
  loop_->tasks.post([loop = loop_.get()] { loop->hasEnded = true; });
}

void GLibThread::post(Task task) {
  loop_->tasks.post(std::move(task));
}

} // namespace lumora::backend
