#pragma once

#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <atomic>
#include <cstdint>
#include <filesystem>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string_view>
#include <vector>

/// Posted by an LMRDiskSpaceWatch on the main thread, with an LMRDiskSpace, when the room in a folder has fallen below
/// the low-water mark: once, and again only after there was enough in between.
inline constexpr std::string_view LMRDiskSpaceIsLowNotification = "LMRDiskSpaceIsLowNotification";

/// The room that there is for recordings in a folder, and how fast they will use it up.
struct LUMORA_EXPORT LMRDiskSpace {
  /// The folder that the recordings are written to.
  std::filesystem::path folder;
  /// What the user may still write there.
  std::uint64_t availableBytes = 0;
  /// What the recordings take together, as far as it is known: the pictures of a session that does not run yet are
  /// taken for 1280 x 720, and a still picture takes less.
  std::uint64_t bitsPerSecond = 0;
  /// Below it the room is low.
  std::uint64_t lowWaterMark = 0;

  /// Whether less room is left than the mark.
  bool isLow() const { return availableBytes < lowWaterMark; }
  /// How long can be recorded until the room is low; infinite when nothing is recorded there.
  double secondsLeft() const;

  /// The room in a folder for sources that take so many bits a second each (MovieFileOutput::expectedBitRate()), also
  /// when nobody is recording. For a folder that is yet to be made it is that of the nearest one above. Nothing when
  /// the system does not tell. Blocks for as long as the disk takes to answer. Any thread. \param lowWaterMark in
  /// bytes; raised as LMRDiskSpaceWatch::leastSecondsLeft says
  static std::optional<LMRDiskSpace> spaceInFolder_bitRates_lowWaterMark(const std::filesystem::path& folder,
                                                                         const std::vector<std::uint64_t>& bitRates,
                                                                         std::uint64_t lowWaterMark);
};

/// Forecasts, before the start, how long a recording can be, and watches the disk while it is made.
///
///     auto watch = LMRDiskSpaceWatch::watchWithRecorder(recorder);
///     recorder->bootstrap();
///     for (const LMRDiskSpace& space : watch->forecast()) { ... }      // space.secondsLeft()
///     lowSpace_ = lumora::Platform::current().notificationCenter->observe(
///         LMRDiskSpaceIsLowNotification, [this](const std::any& object) {
///           const auto& space = std::any_cast<const LMRDiskSpace&>(object);
///           ...                                                        // warn the user, or stop
///         });
///     watch->start();
///     recorder->start();
///
/// It looks at the folders of the recorder's local files: of a local recorder itself, or of those in a combined
/// recorder. Nothing is stopped by the watch. Any thread.
class LUMORA_EXPORT LMRDiskSpaceWatch : public std::enable_shared_from_this<LMRDiskSpaceWatch> {
  // Makes the constructor callable by the factory only.
  struct MadeByFactory {
    explicit MadeByFactory() = default;
  };

public:
  /// In bytes: 500 MB.
  static constexpr std::uint64_t defaultLowWaterMark = 500'000'000;
  /// A mark that is smaller than what the recordings take in this many seconds is raised to that, so that there is
  /// always time to react and room to finish every file.
  static constexpr std::uint64_t leastSecondsLeft = 10;

  /// The recorder is not owned; nothing is watched any more when it has died.
  static std::shared_ptr<LMRDiskSpaceWatch> watchWithRecorder(const std::shared_ptr<LMRSourceRecorder>& recorder);

  LMRDiskSpaceWatch(MadeByFactory key, const std::shared_ptr<LMRSourceRecorder>& recorder);
  LMRDiskSpaceWatch(const LMRDiskSpaceWatch&) = delete;
  LMRDiskSpaceWatch& operator=(const LMRDiskSpaceWatch&) = delete;
  ~LMRDiskSpaceWatch();

  /// In bytes. Takes effect with the next look.
  std::uint64_t lowWaterMark() const { return lowWaterMark_; }
  void setLowWaterMark(std::uint64_t bytes) { lowWaterMark_ = bytes; }

  /// The room now, one entry a folder. Folders are known once the recorder was bootstrapped; one whose room the system
  /// does not tell is left out. Blocks for as long as the disk takes to answer.
  std::vector<LMRDiskSpace> forecast() const;

  /// Looks now and then every second, on a worker, until stop() or the end of the watch. Without effect when it is
  /// looking already.
  void start();
  /// Nothing is posted after a stop on the main thread; after one on another thread, a notice may be on its way.
  void stop();

private:
  void look(std::uint64_t run);
  void lookAgainLater(std::uint64_t run);
  bool isNews(const LMRDiskSpace& space);
  void post(const LMRDiskSpace& space, std::uint64_t run);
  bool isCurrent(std::uint64_t run) const;

  const std::weak_ptr<LMRSourceRecorder> recorder_;
  std::atomic<std::uint64_t> lowWaterMark_{defaultLowWaterMark};

  mutable std::mutex mutex_;
  // Which start this is; what an earlier one left behind has no effect.
  std::uint64_t run_ = 0;
  bool isRunning_ = false;
  std::map<std::filesystem::path, bool> wasLow_;
};
