// How far the sources of one recording are apart: two cameras, the screen and the microphone record a light that
// flashes and a beep, with three pauses; the files are then searched for both.
//
//   bench-sync [SECONDS]      60 unless told otherwise
#include "Analysis.h"
#include "BareMicrophone.h"
#include "Generator.h"
#include "Light.h"
#include "support/Figures.h"

#include <algorithm>
#include <cmath>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string_view>

#include <sched.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using namespace lumora;
using namespace lumora::bench;

constexpr const char* devices = LUMORA_SOURCE_DIR "/examples/headless-devices";
constexpr double pictureInterval = 1000.0 / 30;
constexpr const char* places[] = {"start", "after pause 1", "after pause 2", "after pause 3"};

[[noreturn]] void fail(const char* what) {
  std::fprintf(stderr, "%s\n", what);
  std::exit(EXIT_FAILURE);
}

pid_t startGenerator() {
  const pid_t parent = ::getpid();
  const pid_t pid = ::fork();
  if (pid == 0) {
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (::getppid() == parent) {
      ::execl("/proc/self/exe", "bench-sync", "--generate", nullptr);
    }
    ::_exit(127);
  }
  return pid;
}

// Devices keep time by themselves, however busy the machine is: the stand-ins go before all else, where that is
// allowed. What records does not.
void setPriority(int policy, int priority) {
  sched_param parameters{};
  parameters.sched_priority = priority;
  ::sched_setscheduler(0, policy, &parameters);
}

struct Range {
  double least = HUGE_VAL;
  double most = -HUGE_VAL;
  double sum = 0;
  int count = 0;

  void add(double value) {
    least = std::min(least, value);
    most = std::max(most, value);
    sum += value;
    ++count;
  }
  double mean() const { return sum / count; }
  double magnitude() const { return std::max(std::abs(least), std::abs(most)); }
};

// In milliseconds, of what both have, by the number of pauses before it.
std::vector<Range> differences(const Onsets& one, const Onsets& other, const std::map<HostTime, std::size_t>& flashes) {
  std::vector<Range> result(std::size(places));
  for (const auto& [flash, pauses] : flashes) {
    const auto first = one.find(flash);
    const auto second = other.find(flash);
    if (first != one.end() && second != other.end()) {
      result.at(pauses).add((second->second - first->second) * 1e3);
    }
  }
  if (std::ranges::any_of(result, [](const Range& range) { return range.count == 0; })) {
    fail("A part of the recording has no flash that can be compared");
  }
  return result;
}

void print(const std::string& what, const std::vector<Range>& ranges) {
  std::printf("  %-46s", what.c_str());
  for (std::size_t i = 0; i < ranges.size(); ++i) {
    std::printf("  %s %+.2f (%+.2f to %+.2f)", places[i], ranges[i].mean(), ranges[i].least, ranges[i].most);
  }
  std::printf("\n");
}

Range whole(const std::vector<Range>& ranges) {
  Range result;
  for (const Range& range : ranges) {
    result.add(range.least);
    result.add(range.most);
  }
  return result;
}

// What the ranges change by from one to the next: a pause that is longer for one source than for the other.
double worstStep(const std::vector<Range>& ranges) {
  double worst = 0;
  for (std::size_t i = 1; i < ranges.size(); ++i) {
    worst = std::max(worst, std::abs(ranges[i].mean() - ranges[i - 1].mean()));
  }
  return worst;
}

struct Worst {
  double offset = 0;
  double paused = 0;
  double drift = 0;

  void take(const std::vector<Range>& ranges) {
    offset = std::max(offset, whole(ranges).magnitude());
    paused = std::max(paused, worstStep(ranges));
    drift = std::max(drift, std::abs(ranges.back().mean() - ranges.front().mean()));
  }
};

// As if the microphone heard the beep at once: each without its way through the sound server.
Onsets soundOnsets(const RecordedFile& file, const Onsets& soundDelays) {
  Onsets result;
  for (const auto& [flash, onset] : soundOnsets(file)) {
    if (const auto delay = soundDelays.find(flash); delay != soundDelays.end()) {
      result[flash] = onset - delay->second;
    }
  }
  return result;
}

bool reportOffsets(const std::vector<RecordedFile>& files, const std::map<HostTime, std::size_t>& flashes,
                   const Onsets& soundDelays) {
  std::vector<Onsets> onsets;
  Worst worst;
  for (const RecordedFile& file : files) {
    onsets.push_back(file.hasPictures ? lightOnsets(file) : soundOnsets(file, soundDelays));
  }
  for (std::size_t one = 0; one < files.size(); ++one) {
    for (std::size_t other = one + 1; other < files.size(); ++other) {
      const auto ranges = differences(onsets[one], onsets[other], flashes);
      print(files[one].name + " to " + files[other].name, ranges);
      worst.take(ranges);
    }
  }
  bool good = report("offset between any two sources, at any flash", worst.offset, Bar::AtMost, pictureInterval, "ms");
  good &= report("paused time of any two sources, difference", worst.paused, Bar::AtMost, pictureInterval, "ms");
  good &= report("drift between any two sources, start to end", worst.drift, Bar::AtMost, pictureInterval, "ms");
  return good;
}

bool reportLostPictures(const std::vector<RecordedFile>& files) {
  long lostByCameras = 0;
  for (const RecordedFile& file : files) {
    if (file.hasPictures) {
      const long lost = lostPictures(file);
      std::printf("  %s: %ld pictures lost\n", file.name.c_str(), lost);
      lostByCameras += file.name.starts_with("camera") ? lost : 0;
    }
  }
  return report("frames lost by two cameras at 720p30, beside screen and microphone",
                static_cast<double>(lostByCameras), Bar::AtMost, 0, "frames");
}

bool reportSound(const RecordedFile& file, const std::map<HostTime, std::size_t>& flashes, const Onsets& soundDelays) {
  const auto ranges = differences(lightOnsets(file), soundOnsets(file, soundDelays), flashes);
  print("sound to picture in " + file.name, ranges);
  const Range range = whole(ranges);
  bool good = report("sound before its picture, one file", std::max(0.0, -range.least), Bar::AtMost, 5, "ms");
  good &= report("sound after its picture, one file", std::max(0.0, range.most), Bar::AtMost, 15, "ms");
  good &= report("sound against picture, change by a pause", worstStep(ranges), Bar::AtMost, 5, "ms");
  return good;
}

int measure(double seconds) {
  std::string folder = std::filesystem::temp_directory_path() / "lumora-bench-XXXXXX";
  if (!::mkdtemp(folder.data())) {
    fail("mkdtemp");
  }
  const pid_t generator = startGenerator();
  setPriority(SCHED_OTHER, 0);
  const auto microphone = std::make_unique<BareMicrophone>();
  const auto files = record(folder, seconds);
  const Onsets soundDelays = microphone->delays();
  ::kill(generator, SIGKILL);
  ::waitpid(generator, nullptr, 0);
  bool good = false;
  if (!files.empty()) {
    const auto flashes = flashesIn(files.front());
    Range delay;
    for (const auto& [flash, delayed] : soundDelays) {
      delay.add(delayed * 1e3);
    }
    std::printf("%.0f s, %zu flashes, times in milliseconds, mean (least to most).\n"
                "The sound's way through the sound server, %.2f (%.2f to %.2f), is taken off.\n",
                seconds, flashes.size(), delay.mean(), delay.least, delay.most);
    good = reportOffsets(files, flashes, soundDelays);
    good &= reportSound(files.front(), flashes, soundDelays);
    good &= reportLostPictures(files);
  }
  if (!std::getenv("LUMORA_KEEP")) {
    std::filesystem::remove_all(folder);
  }
  return good ? EXIT_SUCCESS : EXIT_FAILURE;
}

} // namespace

int main(int argc, char** argv) {
  const std::string_view mode = argc > 1 ? argv[1] : "180";
  if (mode == "--generate") {
    return generate();
  }
  if (mode == "--measure" && argc == 3) {
    return measure(std::atof(argv[2]));
  }
  setPriority(SCHED_RR, 10);
  // "/proc/self/exe" would be another program in the script.
  const std::string self = std::filesystem::read_symlink("/proc/self/exe");
  ::execl(devices, devices, self.c_str(), "--measure", mode.data(), nullptr);
  fail("the headless devices do not start");
}
