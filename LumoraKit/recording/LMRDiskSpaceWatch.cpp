#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/recording/LMRDiskSpaceWatch.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>

#include <algorithm>
#include <limits>
#include <numeric>
#include <utility>

namespace {

constexpr std::chrono::seconds interval{1};
constexpr std::uint64_t bitsInByte = 8;

std::vector<std::shared_ptr<LMRSourceRecorder>> sourcesOf(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  const auto combined = std::dynamic_pointer_cast<LMRMultipleSourceRecorder>(recorder);
  return combined ? combined->sourceRecorders() : std::vector{recorder};
}

// What is recorded into each folder, in bits a second.
std::map<std::filesystem::path, std::uint64_t> bitRates(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  std::map<std::filesystem::path, std::uint64_t> rates;
  for (const auto& source : sourcesOf(recorder)) {
    const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(source);
    const auto file = local ? local->outputFileURL() : std::nullopt;
    const auto output = local ? local->movieFileOutput() : nullptr;
    if (file && output) {
      rates[file->parent_path()] += output->expectedBitRate();
    }
  }
  return rates;
}

} // namespace

double LMRDiskSpace::secondsLeft() const {
  if (isLow()) {
    return 0;
  }
  if (bitsPerSecond == 0) {
    return std::numeric_limits<double>::infinity();
  }
  return static_cast<double>(availableBytes - lowWaterMark) * bitsInByte / static_cast<double>(bitsPerSecond);
}

std::optional<LMRDiskSpace> LMRDiskSpace::spaceInFolder_bitRates_lowWaterMark(
    const std::filesystem::path& folder, const std::vector<std::uint64_t>& bitRates, std::uint64_t lowWaterMark) {
  auto& files = *lumora::Platform::current().files;
  auto existing = folder;
  while (!files.isDirectory(existing) && existing.has_relative_path()) {
    existing = existing.parent_path();
  }
  const auto available = files.availableSpace(existing);
  if (!available) {
    return std::nullopt;
  }
  const auto rate = std::accumulate(bitRates.begin(), bitRates.end(), std::uint64_t{0});
  const std::uint64_t leastMark = rate / bitsInByte * LMRDiskSpaceWatch::leastSecondsLeft;
  return LMRDiskSpace{folder, *available, rate, std::max(lowWaterMark, leastMark)};
}

std::shared_ptr<LMRDiskSpaceWatch>
LMRDiskSpaceWatch::watchWithRecorder(const std::shared_ptr<LMRSourceRecorder>& recorder) {
  return std::make_shared<LMRDiskSpaceWatch>(MadeByFactory(), recorder);
}

LMRDiskSpaceWatch::LMRDiskSpaceWatch(MadeByFactory, const std::shared_ptr<LMRSourceRecorder>& recorder)
    : recorder_(recorder) {}

LMRDiskSpaceWatch::~LMRDiskSpaceWatch() = default;

std::vector<LMRDiskSpace> LMRDiskSpaceWatch::forecast() const {
  std::vector<LMRDiskSpace> spaces;
  const auto recorder = recorder_.lock();
  if (!recorder) {
    return spaces;
  }
  for (const auto& [folder, rate] : bitRates(recorder)) {
    if (auto space = LMRDiskSpace::spaceInFolder_bitRates_lowWaterMark(folder, {rate}, lowWaterMark())) {
      spaces.push_back(std::move(*space));
    }
  }
  return spaces;
}

void LMRDiskSpaceWatch::start() {
  std::uint64_t run = 0;
  {
    const std::lock_guard lock(mutex_);
    if (std::exchange(isRunning_, true)) {
      return;
    }
    run = ++run_;
    wasLow_.clear();
  }
  lumora::Platform::current().queues->concurrentQueue()->async([weak = weak_from_this(), run] {
    if (const auto self = weak.lock()) {
      self->look(run);
    }
  });
}

void LMRDiskSpaceWatch::stop() {
  const std::lock_guard lock(mutex_);
  isRunning_ = false;
}

bool LMRDiskSpaceWatch::isCurrent(std::uint64_t run) const {
  const std::lock_guard lock(mutex_);
  return isRunning_ && run_ == run;
}

// The next look is arranged when this one has ended: a disk that hangs is asked once.
void LMRDiskSpaceWatch::look(std::uint64_t run) {
  if (!isCurrent(run)) {
    return;
  }
  for (const LMRDiskSpace& space : forecast()) {
    if (isNews(space)) {
      post(space, run);
    }
  }
  lookAgainLater(run);
}

void LMRDiskSpaceWatch::lookAgainLater(std::uint64_t run) {
  const auto& queues = lumora::Platform::current().queues;
  queues->runAfter(interval, queues->concurrentQueue(), [weak = weak_from_this(), run] {
    if (const auto self = weak.lock()) {
      self->look(run);
    }
  });
}

bool LMRDiskSpaceWatch::isNews(const LMRDiskSpace& space) {
  const std::lock_guard lock(mutex_);
  bool& wasLow = wasLow_[space.folder];
  return !std::exchange(wasLow, space.isLow()) && space.isLow();
}

void LMRDiskSpaceWatch::post(const LMRDiskSpace& space, std::uint64_t run) {
  lumora::log("Disk space is low: %@ bytes are left in %@",
              {std::to_string(space.availableBytes), lumora::text(space.folder)});
  lumora::Platform::current().queues->mainQueue()->async([weak = weak_from_this(), space, run] {
    const auto self = weak.lock();
    if (self && self->isCurrent(run)) {
      lumora::Platform::current().notificationCenter->post(LMRDiskSpaceIsLowNotification, space);
    }
  });
}
