#include <LumoraKit/platform/linux/DelayedTasks.h>
#include <LumoraKit/platform/linux/ThreadPool.h>

#include <csignal>
#include <system_error>
#include <thread>
#include <utility>

namespace lumora::backend {
namespace {

constexpr std::chrono::milliseconds retryInterval{20};

// Blocks every signal that is not raised by a thread's own fault; a new thread inherits the mask.
class SignalsBlocked {
public:
  SignalsBlocked() {
    sigset_t blocked;
    sigfillset(&blocked);
    for (const int own : {SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGTRAP, SIGABRT, SIGSYS}) {
      sigdelset(&blocked, own);
    }
    pthread_sigmask(SIG_SETMASK, &blocked, &before_);
  }
  ~SignalsBlocked() { pthread_sigmask(SIG_SETMASK, &before_, nullptr); }
  SignalsBlocked(const SignalsBlocked&) = delete;
  SignalsBlocked& operator=(const SignalsBlocked&) = delete;

private:
  sigset_t before_{};
};

} // namespace

bool startThread(Task body) {
  const SignalsBlocked signals;
  try {
    std::thread(std::move(body)).detach();
    return true;
  } catch (const std::system_error&) {
    return false;
  }
}

ThreadPool::ThreadPool(std::shared_ptr<DelayedTasks> retries, ThreadStarter start, std::chrono::milliseconds idleTime)
    : retries_(std::move(retries)), start_(std::move(start)), idleTime_(idleTime) {}

void ThreadPool::post(Task task, Priority priority) {
  {
    const std::lock_guard lock(mutex_);
    (priority == Priority::High ? highTasks_ : tasks_).push_back(std::move(task));
  }
  posted_.notify_one();
  grow();
}

bool ThreadPool::needsThread() const {
  return highTasks_.size() + tasks_.size() > idle_ + starting_;
}

// Starts a thread for every task that no idle or starting thread will take.
void ThreadPool::grow() {
  std::unique_lock lock(mutex_);
  while (needsThread()) {
    ++starting_;
    lock.unlock();
    const bool started = start_([self = shared_from_this()] { self->work(); });
    lock.lock();
    if (!started) {
      --starting_;
      growLater();
      return;
    }
  }
}

void ThreadPool::growLater() {
  if (std::exchange(retrying_, true)) {
    return;
  }
  retries_->runAfter(retryInterval, [self = shared_from_this()] {
    {
      const std::lock_guard lock(self->mutex_);
      self->retrying_ = false;
    }
    self->grow();
  });
}

void ThreadPool::work() {
  std::unique_lock lock(mutex_);
  --starting_;
  while (waitForTask(lock)) {
    Task task = takeNext();
    lock.unlock();
    task();
    // What the task holds dies before the lock is taken again.
    task = nullptr;
    lock.lock();
  }
}

// False when nothing came for a while.
bool ThreadPool::waitForTask(std::unique_lock<std::mutex>& lock) {
  ++idle_;
  const bool found = posted_.wait_for(lock, idleTime_, [this] { return !highTasks_.empty() || !tasks_.empty(); });
  --idle_;
  return found;
}

Task ThreadPool::takeNext() {
  auto& tasks = highTasks_.empty() ? tasks_ : highTasks_;
  Task task = std::move(tasks.front());
  tasks.pop_front();
  return task;
}

} // namespace lumora::backend
