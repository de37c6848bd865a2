// kill -9 in the midst of recordings of three sources.
#include "Victim.h"
#include "support/ChildProgram.h"
#include "support/Descriptors.h"
#include "support/HeadlessDevices.h"
#include "support/Movie.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRMovieFile.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <iostream>
#include <memory>
#include <mutex>
#include <random>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

namespace {

using lumora::testing::Movie;

// A program under a sanitizer takes several seconds to begin: a fifth of the kills then.
constexpr int kills = 50;
constexpr int killsWithASanitizer = 10;
// Two at a time: one begins or is looked at while the other records.
constexpr int lanes = 2;

// What a killed recording may lack at its end, in seconds: one fragment and what was on its way.
constexpr double mayLack = 1.2;

// A recorder in another process, until it is killed.
class Victim {
public:
  Victim(const std::string& camera, const std::filesystem::path& folder)
      : program_(
            lumora::tests::ChildProgram::startSelf({recordUntilKilledSwitch, "video:" + camera, folder.string()})) {
    std::istringstream words(program_->readLine());
    words >> requested_;
    for (std::string file; words >> file;) {
      files_.emplace_back(file);
    }
  }

  bool records() const { return files_.size() == 3; }
  const std::vector<std::filesystem::path>& files() const { return files_; }
  /// Ends it; how long it has recorded, in seconds.
  double kill() {
    const auto now = lumora::Platform::current().mediaCapture->hostTime();
    program_->kill();
    return static_cast<double>(now - requested_) / 1e9;
  }

private:
  const std::unique_ptr<lumora::tests::ChildProgram> program_;
  lumora::HostTime requested_ = 0;
  std::vector<std::filesystem::path> files_;
};

void expectTrack(const Movie& movie, const char* type, double recorded, const std::string& what) {
  const auto times = movie.times(type);
  ASSERT_FALSE(times.empty()) << what;
  EXPECT_GT(times.back(), recorded - mayLack) << what;
}

// What the framework itself makes of it.
void expectRepair(const std::filesystem::path& file, const std::string& what) {
  auto found = LMRMovieFile::movieFileWithPath(file);
  EXPECT_EQ(found.repair(), nullptr) << what << ": " << found.reason;
  EXPECT_TRUE(LMRMovieFile::movieFileWithPath(file).isPlayable()) << what;
  EXPECT_NEAR(Movie(file).duration(), found.duration, 0.1) << what;
}

// A file that is younger than what may be lacking may be anything.
void expectFiles(const Victim& victim, double recorded) {
  if (recorded < mayLack) {
    return;
  }
  for (std::size_t i = 0; i < victim.files().size(); ++i) {
    const std::string what = "source " + std::to_string(i) + ", killed after " + std::to_string(recorded) + " s";
    const Movie movie(victim.files()[i]);
    EXPECT_TRUE(movie.decodes()) << what;
    if (i != 2) {
      expectTrack(movie, "v", recorded, what);
    }
    if (i != 1) {
      expectTrack(movie, "a", recorded, what);
    }
    expectRepair(victim.files()[i], what);
  }
}

// The headless camera does not always survive that its program is killed: it is then replaced, which is not what is
// tested here.
class Cameras {
public:
  explicit Cameras(lumora::testing::HeadlessDevices& devices) : devices_(devices) {}

  std::string add() {
    const std::lock_guard lock(mutex_);
    std::string name = "lumora_camera_" + std::to_string(++count_);
    EXPECT_TRUE(devices_.add("camera", name));
    return name;
  }
  std::string replace(const std::string& camera) {
    {
      const std::lock_guard lock(mutex_);
      EXPECT_TRUE(devices_.remove(camera));
    }
    return add();
  }

private:
  std::mutex mutex_;
  lumora::testing::HeadlessDevices& devices_;
  int count_ = 0;
};

// Records and is killed at a random moment in the three seconds after the start. False when it did not record.
bool killOne(const std::string& camera, std::mt19937& random) {
  const lumora::tests::TemporaryFolder folder;
  Victim victim(camera, folder.path());
  if (!victim.records()) {
    return false;
  }
  std::this_thread::sleep_for(std::chrono::milliseconds(std::uniform_int_distribution(0, 3000)(random)));
  const double recorded = victim.kill();
  expectFiles(victim, recorded);
  return true;
}

void killMany(Cameras& cameras, int count, std::mt19937 random) {
  std::string camera = cameras.add();
  int failures = 0;
  for (int killed = 0; killed < count;) {
    if (killOne(camera, random)) {
      ++killed;
    } else {
      ASSERT_LT(++failures, count) << "the recordings do not start";
      camera = cameras.replace(camera);
    }
  }
}

TEST(KilledRecording, everyFilePlaysAndLacksLittle_whenKilledAtRandomMoments) {
  std::string reason;
  const auto devices = lumora::testing::HeadlessDevices::start(reason);
  if (!devices) {
    GTEST_SKIP() << reason;
  }
  if (!Movie::canBeRead()) {
    GTEST_SKIP() << "ffprobe and ffmpeg are not installed";
  }
  const auto seed = std::random_device()();
  std::cout << "seed " << seed << '\n';
  const int count = lumora::tests::memoryCanBeMeasured() ? kills : killsWithASanitizer;
  Cameras cameras(*devices);
  std::vector<std::thread> threads;
  for (unsigned lane = 0; lane < lanes; ++lane) {
    threads.emplace_back(
        [&cameras, count, random = std::mt19937(seed + lane)] { killMany(cameras, count / lanes, random); });
  }
  for (auto& thread : threads) {
    thread.join();
  }
}

} // namespace
