#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/UserInterface.h>
#include <LumoraKit/platform/linux/Backends.h>

#include <atomic>
#include <deque>
#include <mutex>
#include <utility>

namespace lumora {
namespace {

Platform makeMachinePlatform() {
  Platform platform;
  platform.application = backend::makeApplication();
  platform.credentialStore = backend::makeCredentialStore();
  platform.files = backend::makeFiles();
  platform.helperAgent = backend::makeHelperAgent();
  platform.kerberos = backend::makeKerberos();
  platform.log = backend::makeSystemLog();
  platform.mainThread = backend::makeMainThread();
  platform.notificationCenter = std::make_shared<NotificationCenter>();
  platform.preferences = backend::makePreferences();
  platform.queues = backend::makeQueues(platform.mainThread);
  platform.mediaCapture = backend::makeMediaCapture(platform.queues);
  platform.serviceDiscovery = backend::makeServiceDiscovery();
  platform.toolRunner = backend::makeToolRunner();
  platform.userInterface = UserInterface::none();
  platform.wallClock = backend::makeWallClock();
  return platform;
}

bool isComplete(const Platform& platform) {
  return platform.application && platform.credentialStore && platform.files && platform.helperAgent &&
         platform.kerberos && platform.log && platform.mainThread && platform.mediaCapture &&
         platform.notificationCenter && platform.preferences && platform.queues && platform.serviceDiscovery &&
         platform.toolRunner && platform.userInterface && platform.wallClock;
}

// Every platform that was ever installed stays: references to it are handed out without a count, and a detached
// worker may still use it while the process exits. Never destroyed for the same reason.
class Installed {
public:
  const Platform& current() {
    if (const Platform* platform = current_.load(std::memory_order_acquire)) {
      return *platform;
    }
    const std::lock_guard lock(mutex_);
    if (!current_.load(std::memory_order_relaxed)) {
      keep(makeMachinePlatform());
    }
    return *current_.load(std::memory_order_relaxed);
  }

  void install(Platform platform) {
    const std::lock_guard lock(mutex_);
    keep(std::move(platform));
  }

private:
  void keep(Platform platform) {
    current_.store(&platforms_.emplace_back(std::move(platform)), std::memory_order_release);
  }

  std::mutex mutex_;
  std::deque<Platform> platforms_;
  std::atomic<const Platform*> current_{nullptr};
};

Installed& installed() {
  static auto* const instance = new Installed;
  return *instance;
}

} // namespace

void Platform::setMainThread(std::shared_ptr<MainThread> newMainThread) {
  mainThread = std::move(newMainThread);
  queues = backend::makeQueues(mainThread);
}

const Platform& Platform::current() {
  return installed().current();
}

void Platform::install(Platform platform) {
  assertThat(isComplete(platform), "every member is set", "install", "Platform");
  installed().install(std::move(platform));
}

} // namespace lumora
