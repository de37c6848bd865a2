#include "support/Movie.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <sstream>

namespace lumora::testing {
namespace {

struct Result {
  std::string output;
  int status;
};

Result shell(const std::string& command) {
  Result result{{}, -1};
  std::FILE* const pipe = ::popen(command.c_str(), "re");
  char buffer[65536];
  for (std::size_t size = 1; size != 0;) {
    size = std::fread(buffer, 1, sizeof buffer, pipe);
    result.output.append(buffer, size);
  }
  result.status = ::pclose(pipe);
  return result;
}

} // namespace

bool Movie::canBeRead() {
  return shell("command -v ffprobe && command -v ffmpeg").status == 0;
}

bool Movie::decodes() const {
  const Result result = shell("ffmpeg -v error -xerror -i '" + file_.string() + "' -fps_mode vfr -f null - 2>&1");
  std::fputs(result.output.c_str(), stderr);
  return result.status == 0 && result.output.empty();
}

std::string Movie::probe(const std::string& arguments) const {
  return shell("ffprobe -v error -of csv=p=0 " + arguments + " '" + file_.string() + "'").output;
}

double Movie::duration() const {
  return std::atof(probe("-show_entries format=duration").c_str());
}

std::string Movie::stream(const std::string& type, const std::string& entry) const {
  const std::string text = probe("-select_streams " + type + ":0 -show_entries stream=" + entry);
  return text.substr(0, text.find_first_of(",\n"));
}

std::vector<double> Movie::times(const std::string& type) const {
  std::istringstream lines(probe("-select_streams " + type + ":0 -show_entries packet=pts_time"));
  std::vector<double> times;
  for (std::string line; std::getline(lines, line);) {
    times.push_back(std::atof(line.c_str()));
  }
  std::ranges::sort(times);
  return times;
}

std::vector<std::uint8_t> Movie::middleRow(double seconds) const {
  const Result result = shell("ffmpeg -v error -ss " + std::to_string(seconds) + " -i '" + file_.string() +
                              "' -map 0:v -vf crop=iw:2:0:ih/2 -frames:v 1 -f rawvideo -pix_fmt gray -");
  const auto row = result.output.substr(0, result.output.size() / 2);
  return {row.begin(), row.end()};
}

std::vector<double> Movie::sound() const {
  const Result result = shell("ffmpeg -v error -i '" + file_.string() +
                              "' -map 0:a -af aresample=48000:async=1:first_pts=0 -ac 2 -f s16le -");
  std::vector<double> samples;
  for (std::size_t i = 0; i + 3 < result.output.size(); i += 4) {
    const auto low = static_cast<unsigned char>(result.output[i]);
    const auto high = static_cast<unsigned char>(result.output[i + 1]);
    samples.push_back(static_cast<std::int16_t>(low | high << 8) / 32768.0);
  }
  return samples;
}

} // namespace lumora::testing
