#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <atomic>
#include <deque>
#include <map>
#include <mutex>
#include <thread>
#include <utility>

namespace lumora::fakes {

// What waits, and the time.
class ManualQueues::Schedule {
public:
  using Time = std::chrono::nanoseconds;

  bool isOwner() const { return std::this_thread::get_id() == owner_; }

  void post(std::shared_ptr<WorkQueue> queue, Task task) {
    const std::lock_guard lock(mutex_);
    ready_.push_back({std::move(queue), std::move(task)});
  }

  void postAfter(Time delay, std::shared_ptr<WorkQueue> queue, Task task) {
    const std::lock_guard lock(mutex_);
    delayed_.emplace(after(delay), Item{std::move(queue), std::move(task)});
  }

  bool runNext() {
    Item item;
    {
      const std::lock_guard lock(mutex_);
      if (ready_.empty()) {
        return false;
      }
      item = std::move(ready_.front());
      ready_.pop_front();
    }
    const auto before = std::exchange(running_, Running{true, item.queue});
    item.task();
    running_ = before;
    return true;
  }

  // Hands the delayed tasks of the next moment to their queues; false when that lies behind the limit.
  bool enterNextMoment(Time limit) {
    std::unique_lock lock(mutex_);
    if (delayed_.empty() || delayed_.begin()->first > limit) {
      return false;
    }
    now_ = delayed_.begin()->first;
    while (!delayed_.empty() && delayed_.begin()->first == now_.load()) {
      Item item = std::move(delayed_.extract(delayed_.begin()).mapped());
      lock.unlock();
      item.queue->async(std::move(item.task));
      lock.lock();
    }
    return true;
  }

  void setNow(Time now) { now_ = now; }

  // Drops what was never run: tasks hold their queues, and queues hold this.
  void clear() {
    std::deque<Item> ready;
    std::multimap<Time, Item> delayed;
    const std::lock_guard lock(mutex_);
    ready_.swap(ready);
    delayed_.swap(delayed);
  }

  // The moment that lies so far ahead, or the last there is.
  Time after(Time delay) const {
    const Time now = now_;
    return delay < Time::max() - now ? now + delay : Time::max();
  }

  std::size_t pending() const {
    const std::lock_guard lock(mutex_);
    return ready_.size();
  }

  // The queue of the task that runs, null for one of a concurrent queue; outside every task the given one.
  std::shared_ptr<WorkQueue> currentOr(const std::shared_ptr<WorkQueue>& mainQueue) const {
    return running_.isTask ? running_.queue : mainQueue;
  }

private:
  struct Item {
    std::shared_ptr<WorkQueue> queue;
    Task task;
  };
  struct Running {
    bool isTask = false;
    std::shared_ptr<WorkQueue> queue;
  };

  const std::thread::id owner_ = std::this_thread::get_id();
  mutable std::mutex mutex_;
  std::deque<Item> ready_;
  std::multimap<Time, Item> delayed_;
  std::atomic<Time> now_{Time::zero()};
  Running running_;
};

class ManualQueues::Queue final : public WorkQueue, public std::enable_shared_from_this<Queue> {
public:
  Queue(std::string label, bool isConcurrent, std::shared_ptr<Schedule> schedule)
      : label_(std::move(label)), isConcurrent_(isConcurrent), schedule_(std::move(schedule)) {}

  const std::string& label() const override { return label_; }
  void async(Task task) override { schedule_->post(isConcurrent_ ? nullptr : shared_from_this(), std::move(task)); }

private:
  const std::string label_;
  const bool isConcurrent_;
  const std::shared_ptr<Schedule> schedule_;
};

class ManualQueues::MainThreadOfSchedule final : public MainThread {
public:
  MainThreadOfSchedule(std::shared_ptr<Schedule> schedule, std::shared_ptr<WorkQueue> queue)
      : schedule_(std::move(schedule)), queue_(std::move(queue)) {}

  bool isCurrent() const override { return schedule_->isOwner(); }
  void post(Task task) override { queue_->async(std::move(task)); }

  bool serveUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit) override {
    using std::chrono::nanoseconds;
    const bool isLimited = limit < std::chrono::duration_cast<std::chrono::milliseconds>(nanoseconds::max());
    const auto end = schedule_->after(isLimited ? nanoseconds(limit) : nanoseconds::max());
    while (!condition()) {
      if (!schedule_->runNext() && !schedule_->enterNextMoment(end)) {
        return false;
      }
    }
    return true;
  }

private:
  const std::shared_ptr<Schedule> schedule_;
  const std::shared_ptr<WorkQueue> queue_;
};

ManualQueues::ManualQueues()
    : schedule_(std::make_shared<Schedule>()), mainQueue_(std::make_shared<Queue>("main", false, schedule_)),
      concurrentQueue_(std::make_shared<Queue>("concurrent", true, schedule_)),
      highPriorityQueue_(std::make_shared<Queue>("concurrent, high priority", true, schedule_)),
      mainThread_(std::make_shared<MainThreadOfSchedule>(schedule_, mainQueue_)) {}

ManualQueues::~ManualQueues() {
  schedule_->clear();
}

std::shared_ptr<MainThread> ManualQueues::mainThread() const {
  return mainThread_;
}

bool ManualQueues::runNext() {
  return schedule_->runNext();
}

std::size_t ManualQueues::runAll() {
  std::size_t count = 0;
  while (runNext()) {
    ++count;
  }
  return count;
}

void ManualQueues::advance(std::chrono::nanoseconds time) {
  const auto end = schedule_->after(time);
  do {
    runAll();
  } while (schedule_->enterNextMoment(end));
  schedule_->setNow(end);
}

std::size_t ManualQueues::pending() const {
  return schedule_->pending();
}

std::shared_ptr<WorkQueue> ManualQueues::makeSerialQueue(std::string label) {
  return std::make_shared<Queue>(std::move(label), false, schedule_);
}

std::shared_ptr<WorkQueue> ManualQueues::concurrentQueue() {
  return concurrentQueue_;
}

std::shared_ptr<WorkQueue> ManualQueues::highPriorityQueue() {
  return highPriorityQueue_;
}

std::shared_ptr<WorkQueue> ManualQueues::mainQueue() {
  return mainQueue_;
}

std::shared_ptr<WorkQueue> ManualQueues::currentQueue() {
  return schedule_->isOwner() ? schedule_->currentOr(mainQueue_) : nullptr;
}

void ManualQueues::runAfter(std::chrono::nanoseconds delay, std::shared_ptr<WorkQueue> queue, Task task) {
  assertThat(queue != nullptr, "queue != nil", "runAfter", "ManualQueues");
  if (delay > std::chrono::nanoseconds::zero()) {
    schedule_->postAfter(delay, std::move(queue), std::move(task));
  } else {
    queue->async(std::move(task));
  }
}

} // namespace lumora::fakes
