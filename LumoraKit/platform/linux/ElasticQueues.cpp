#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/DelayedTasks.h>
#include <LumoraKit/platform/linux/ThreadPool.h>

#include <deque>
#include <memory>
#include <mutex>
#include <string>
#include <utility>

namespace lumora::backend {
namespace {

class MainQueue final : public WorkQueue {
public:
  explicit MainQueue(std::shared_ptr<MainThread> mainThread) : mainThread_(std::move(mainThread)) {}

  const std::string& label() const override { return label_; }
  void async(Task task) override { mainThread_->post(std::move(task)); }

private:
  const std::string label_ = "main";
  const std::shared_ptr<MainThread> mainThread_;
};

class ConcurrentQueue final : public WorkQueue {
public:
  ConcurrentQueue(std::string label, std::shared_ptr<ThreadPool> pool, ThreadPool::Priority priority)
      : label_(std::move(label)), pool_(std::move(pool)), priority_(priority) {}

  const std::string& label() const override { return label_; }
  void async(Task task) override { pool_->post(std::move(task), priority_); }

private:
  const std::string label_;
  const std::shared_ptr<ThreadPool> pool_;
  const ThreadPool::Priority priority_;
};

class SerialQueue final : public WorkQueue, public std::enable_shared_from_this<SerialQueue> {
public:
  SerialQueue(std::string label, std::shared_ptr<ThreadPool> pool) : label_(std::move(label)), pool_(std::move(pool)) {}

  const std::string& label() const override { return label_; }
  void async(Task task) override;

  // The queue whose task the calling thread runs, or null.
  static std::shared_ptr<SerialQueue> current() { return running ? running->shared_from_this() : nullptr; }

private:
  void runTasks();

  static thread_local SerialQueue* running;

  const std::string label_;
  const std::shared_ptr<ThreadPool> pool_;
  std::mutex mutex_;
  std::deque<Task> tasks_;
  bool hasThread_ = false;
};

thread_local SerialQueue* SerialQueue::running = nullptr;

void SerialQueue::async(Task task) {
  {
    const std::lock_guard lock(mutex_);
    tasks_.push_back(std::move(task));
    if (std::exchange(hasThread_, true)) {
      return;
    }
  }
  pool_->post([self = shared_from_this()] { self->runTasks(); }, ThreadPool::Priority::Ordinary);
}

void SerialQueue::runTasks() {
  running = this;
  std::unique_lock lock(mutex_);
  while (!tasks_.empty()) {
    Task task = std::move(tasks_.front());
    tasks_.pop_front();
    lock.unlock();
    task();
    // What the task holds dies on the queue, before the next task runs.
    task = nullptr;
    lock.lock();
  }
  hasThread_ = false;
  running = nullptr;
}

class ElasticQueues final : public Queues {
public:
  explicit ElasticQueues(std::shared_ptr<MainThread> mainThread)
      : mainThread_(mainThread), mainQueue_(std::make_shared<MainQueue>(std::move(mainThread))) {}
  ~ElasticQueues() override { delayedTasks_->stopWhenEmpty(); }

  std::shared_ptr<WorkQueue> makeSerialQueue(std::string label) override {
    return std::make_shared<SerialQueue>(std::move(label), pool_);
  }
  std::shared_ptr<WorkQueue> concurrentQueue() override { return concurrentQueue_; }
  std::shared_ptr<WorkQueue> highPriorityQueue() override { return highPriorityQueue_; }
  std::shared_ptr<WorkQueue> mainQueue() override { return mainQueue_; }
  std::shared_ptr<WorkQueue> currentQueue() override;
  void runAfter(std::chrono::nanoseconds delay, std::shared_ptr<WorkQueue> queue, Task task) override;

private:
  const std::shared_ptr<DelayedTasks> delayedTasks_ = DelayedTasks::make();
  const std::shared_ptr<ThreadPool> pool_ = std::make_shared<ThreadPool>(delayedTasks_, &startThread);
  const std::shared_ptr<MainThread> mainThread_;
  const std::shared_ptr<WorkQueue> mainQueue_;
  const std::shared_ptr<WorkQueue> concurrentQueue_ =
      std::make_shared<ConcurrentQueue>("concurrent", pool_, ThreadPool::Priority::Ordinary);
  const std::shared_ptr<WorkQueue> highPriorityQueue_ =
      std::make_shared<ConcurrentQueue>("concurrent, high priority", pool_, ThreadPool::Priority::High);
};

std::shared_ptr<WorkQueue> ElasticQueues::currentQueue() {
  return mainThread_->isCurrent() ? mainQueue_ : SerialQueue::current();
}

void ElasticQueues::runAfter(std::chrono::nanoseconds delay, std::shared_ptr<WorkQueue> queue, Task task) {
  assertThat(queue != nullptr, "queue != nil", "runAfter", "Queues");
  if (delay <= std::chrono::nanoseconds::zero()) {
    queue->async(std::move(task));
    return;
  }
  delayedTasks_->runAfter(
      delay, [queue = std::move(queue), task = std::move(task)]() mutable { queue->async(std::move(task)); });
}

} // namespace

std::shared_ptr<Queues> makeQueues(std::shared_ptr<MainThread> mainThread) {
  return std::make_shared<ElasticQueues>(std::move(mainThread));
}

} // namespace lumora::backend
