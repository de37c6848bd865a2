#include "Measurement.h"

#include <algorithm>
#include <cmath>
#include <iomanip>
#include <iostream>
#include <optional>
#include <sstream>

namespace tester {
namespace {

using Times = std::vector<double>;

// In seconds of the file, of the packets of the first track of a type ("v" or "a"); nothing without ffprobe.
std::optional<Times> packetTimes(const std::filesystem::path& file, const std::string& type) {
  std::string output;
  std::string complaint;
  if (lumora::Platform::current().toolRunner->run("/usr/bin/ffprobe",
                                                  {"-v", "error", "-select_streams", type + ":0", "-show_entries",
                                                   "packet=pts_time,duration_time", "-of", "csv=p=0", file},
                                                  {}, output, complaint) != 0) {
    return std::nullopt;
  }
  Times times;
  std::istringstream lines(output);
  double last = 0;
  for (std::string line; std::getline(lines, line);) {
    const double time = std::strtod(line.c_str(), nullptr);
    const auto comma = line.find(',');
    const double duration = comma == std::string::npos ? 0 : std::strtod(line.c_str() + comma + 1, nullptr);
    last = std::max(last, time + duration);
    times.push_back(time);
  }
  std::sort(times.begin(), times.end());
  // The end of the last packet closes the list.
  if (!times.empty()) {
    times.push_back(last);
  }
  return times;
}

double secondsBetween(lumora::HostTime from, lumora::HostTime to) {
  return (static_cast<double>(to) - static_cast<double>(from)) / 1e9;
}

// Where in the file the recording was paused.
Times seams(const LMRLocalVideoRecorder& recorder) {
  const auto moments = recorder.hostTimesOfFile();
  Times seams;
  double recorded = 0;
  for (std::size_t i = 0; i + 1 < moments.size(); i += 2) {
    recorded += secondsBetween(moments[i], moments[i + 1]);
    seams.push_back(recorded);
  }
  return seams;
}

// Pictures that are missing between two others, at the usual distance; not where a pause was.
long lostPictures(const Times& times, const Times& seams) {
  Times gaps;
  for (std::size_t i = 1; i + 1 < times.size(); ++i) {
    gaps.push_back(times[i] - times[i - 1]);
  }
  if (gaps.empty()) {
    return 0;
  }
  Times sorted = gaps;
  std::nth_element(sorted.begin(), sorted.begin() + static_cast<std::ptrdiff_t>(sorted.size() / 2), sorted.end());
  const double usual = sorted[sorted.size() / 2];
  long lost = 0;
  for (std::size_t i = 1; i < gaps.size(); ++i) {
    const bool isSeam = std::any_of(seams.begin(), seams.end(), [&](double seam) {
      return times[i] <= seam + 0.001 && seam <= times[i + 1] + 0.001;
    });
    lost += isSeam ? 0 : std::lround(gaps[i] / usual) - 1;
  }
  return std::max(0L, lost);
}

std::string number(double value, int digits, const char* unit) {
  std::ostringstream text;
  text << std::fixed << std::setprecision(digits) << value << unit;
  return text.str();
}

std::string signedMilliseconds(double value) {
  std::ostringstream text;
  text << std::showpos << std::fixed << std::setprecision(2) << value * 1e3 << " ms";
  return text.str();
}

void printFile(const Source& source) {
  const auto file = source.recorder->outputFileURL();
  std::cout << "\n" << source.name << "  " << (file ? file->string() : "(no file)") << "\n";
  const auto pictures = file ? packetTimes(*file, "v") : std::nullopt;
  const auto sound = file ? packetTimes(*file, "a") : std::nullopt;
  if (!pictures || !sound) {
    std::cout << "  not measured: ffprobe is not installed (package ffmpeg), or cannot read the file\n";
    return;
  }
  if (!pictures->empty()) {
    const long lost = lostPictures(*pictures, seams(*source.recorder));
    std::cout << "  pictures  " << pictures->size() - 1 << " in " << number(pictures->back(), 3, " s") << ", " << lost
              << " lost\n";
  }
  if (!sound->empty()) {
    std::cout << "  sound     " << number(sound->back(), 3, " s") << "\n";
  }
  if (!pictures->empty() && !sound->empty()) {
    std::cout << "  sound begins " << number((sound->front() - pictures->front()) * 1e3, 1, " ms")
              << " after the picture\n";
  }
}

// How much later than in the first source's file a moment after so many pauses comes in this one's.
double offset(const std::vector<lumora::HostTime>& first, const std::vector<lumora::HostTime>& other,
              std::size_t pauses) {
  double sum = 0;
  for (std::size_t i = 0; i <= 2 * pauses; ++i) {
    sum += (i % 2 == 0 ? 1 : -1) * secondsBetween(other[i], first[i]);
  }
  return sum;
}

} // namespace

void printMeasurements(const std::vector<Source>& sources) {
  for (const Source& source : sources) {
    printFile(source);
  }
  if (sources.size() < 2) {
    return;
  }
  const auto first = sources.front().recorder->hostTimesOfFile();
  std::cout << "\nOffsets to " << sources.front().name << " (+: later in the file)\n";
  for (std::size_t i = 1; i < sources.size(); ++i) {
    const auto moments = sources[i].recorder->hostTimesOfFile();
    std::cout << "  " << std::left << std::setw(14) << sources[i].name;
    const std::size_t count = std::min(first.size(), moments.size());
    for (std::size_t pauses = 0; 2 * pauses < count; ++pauses) {
      std::cout << (pauses == 0 ? "start " : ", after pause " + std::to_string(pauses) + " ")
                << signedMilliseconds(offset(first, moments, pauses));
    }
    std::cout << "\n";
  }
}

} // namespace tester
