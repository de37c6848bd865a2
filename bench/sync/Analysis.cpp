#include "Analysis.h"

#include "BeepFinder.h"
#include "Light.h"

#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/Platform.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <sstream>

namespace lumora::bench {
namespace {

constexpr double interval = 1.0 / 30;
constexpr double soundRate = 48'000;
// How far an onset may be from where the file's own times have it; sound has its way through the sound server to go.
constexpr double tolerance = 0.2;
constexpr double soundTolerance = 0.45;

std::string run(const std::string& program, const std::vector<std::string>& arguments) {
  std::string output;
  std::string complaint;
  if (Platform::current().toolRunner->run(program, arguments, {}, output, complaint) != 0) {
    std::fprintf(stderr, "%s: %s\n", program.c_str(), complaint.c_str());
    std::exit(EXIT_FAILURE);
  }
  return output;
}

double seconds(HostTime time) {
  return static_cast<double>(time) / 1e9;
}

std::vector<double> pictureTimes(const RecordedFile& file) {
  std::istringstream lines(run("/usr/bin/ffprobe", {"-v", "error", "-select_streams", "v:0", "-show_entries",
                                                    "packet=pts_time", "-of", "csv=p=0", file.path}));
  std::vector<double> times;
  for (std::string line; std::getline(lines, line);) {
    times.push_back(std::atof(line.c_str()));
  }
  std::sort(times.begin(), times.end());
  return times;
}

// Of the lamp, from 0 to 1, a picture each.
std::vector<double> brightness(const RecordedFile& file) {
  const std::string pixels = run("/usr/bin/ffmpeg", {"-v", "error", "-i", file.path, "-map", "0:v", "-vf",
                                                     "crop=96:96:32:32,scale=1:1:flags=area", "-pix_fmt", "gray",
                                                     "-fps_mode", "passthrough", "-f", "rawvideo", "-"});
  std::vector<double> levels;
  for (const char pixel : pixels) {
    levels.push_back(static_cast<unsigned char>(pixel) / 255.0);
  }
  return levels;
}

std::vector<double> sound(const RecordedFile& file) {
  const std::string bytes = run("/usr/bin/ffmpeg", {"-v", "error", "-i", file.path, "-map", "0:a", "-af",
                                                    "aresample=48000:async=1:first_pts=0:min_hard_comp=0.001", "-ac",
                                                    "1", "-f", "s16le", "-"});
  std::vector<double> samples(bytes.size() / 2);
  for (std::size_t i = 0; i < samples.size(); ++i) {
    std::int16_t sample = 0;
    std::memcpy(&sample, &bytes[2 * i], sizeof sample);
    samples[i] = sample / 32'768.0;
  }
  return samples;
}

// Between two moments of the list: [begin, end), and the file's time of its begin.
struct Section {
  HostTime begin;
  HostTime end;
  double fileTime;
};

std::vector<Section> sections(const RecordedFile& file) {
  std::vector<Section> result;
  double recorded = 0;
  for (std::size_t i = 0; i < file.moments.size(); i += 2) {
    const bool isLast = i + 1 == file.moments.size();
    // The last one ends with the file; a flash there is found or not.
    const HostTime end = isLast ? file.moments[i] + 86'400'000'000'000 : file.moments[i + 1];
    result.push_back({file.moments[i], end, recorded});
    recorded += seconds(end - file.moments[i]);
  }
  return result;
}

// Each flash between begin and end of the file, with the time at which the file is to have it.
std::map<HostTime, double> expected(const RecordedFile& file, double fileEnd) {
  std::map<HostTime, double> result;
  for (const Section& section : sections(file)) {
    for (HostTime flash = (section.begin / light::period + 1) * light::period;
         flash + light::length < section.end && section.fileTime + seconds(flash - section.begin) + 0.7 < fileEnd;
         flash += light::period) {
      if (flash > section.begin + 100'000'000) {
        result[flash] = section.fileTime + seconds(flash - section.begin);
      }
    }
  }
  return result;
}

double median(std::vector<double> values) {
  std::sort(values.begin(), values.end());
  return values[values.size() / 2];
}

} // namespace

std::map<HostTime, std::size_t> flashesIn(const RecordedFile& file) {
  std::map<HostTime, std::size_t> result;
  const auto all = sections(file);
  for (const auto& [flash, fileTime] : expected(file, pictureTimes(file).back())) {
    std::size_t pauses = 0;
    while (pauses + 1 < all.size() && flash >= all[pauses].end) {
      ++pauses;
    }
    result[flash] = pauses;
  }
  return result;
}

// Every picture of the rise tells when it began: by its time, less the part of the rise that it shows.
Onsets lightOnsets(const RecordedFile& file) {
  const auto times = pictureTimes(file);
  const auto levels = brightness(file);
  Onsets onsets;
  for (const auto& [flash, fileTime] : expected(file, times.back())) {
    std::vector<double> guesses;
    for (std::size_t i = 0; i < std::min(times.size(), levels.size()); ++i) {
      const bool isRising = times[i] > fileTime - tolerance && times[i] < fileTime + tolerance + seconds(light::ramp) &&
                            levels[i] > 0.06 && levels[i] < 0.94;
      if (isRising) {
        guesses.push_back(times[i] - levels[i] * seconds(light::ramp));
      }
    }
    if (!guesses.empty()) {
      onsets[flash] = median(guesses);
    }
  }
  return onsets;
}

Onsets soundOnsets(const RecordedFile& file) {
  const auto samples = sound(file);
  Onsets onsets;
  for (const auto& [flash, fileTime] : expected(file, static_cast<double>(samples.size()) / soundRate)) {
    const auto from = static_cast<std::size_t>(std::max(0.0, (fileTime - tolerance) * soundRate));
    const auto to = std::min(samples.size(), static_cast<std::size_t>((fileTime + soundTolerance) * soundRate));
    BeepFinder finder;
    for (std::size_t i = from; i < to; ++i) {
      // The window's first samples are a step from silence.
      if (finder.feed(samples[i]) && i > from + 2 * BeepFinder::lag) {
        onsets[flash] = static_cast<double>(i - BeepFinder::lag) / soundRate;
        break;
      }
    }
  }
  return onsets;
}

long lostPictures(const RecordedFile& file) {
  const auto times = pictureTimes(file);
  const auto all = sections(file);
  long lost = 0;
  for (std::size_t i = 1; i < times.size(); ++i) {
    const bool isSeam = std::any_of(all.begin() + 1, all.end(), [&](const Section& section) {
      return times[i - 1] < section.fileTime && times[i] > section.fileTime - 0.002;
    });
    // At a seam, and behind the first picture, which stands for what was before it, up to two intervals are right.
    const double usual = isSeam || i == 1 ? 2 * interval : interval;
    lost += std::max(0L, std::lround(std::ceil((times[i] - times[i - 1] - usual) / interval - 0.5)));
  }
  return lost;
}

} // namespace lumora::bench
