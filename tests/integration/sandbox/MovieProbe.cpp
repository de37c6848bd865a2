#include "MovieProbe.h"

#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/Platform.h>

#include <cstdlib>
#include <sstream>

namespace lumora::tests {

namespace {

int run(const std::string& program, const std::vector<std::string>& arguments, std::string& output,
        std::string& error) {
  return Platform::current().toolRunner->run(program, arguments, "", output, error);
}

/// Lines of the form key=value.
void read(const std::string& text, MovieProbe& probe) {
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) {
    const auto equals = line.find('=');
    const std::string key = line.substr(0, equals);
    const std::string value = equals == std::string::npos ? "" : line.substr(equals + 1);
    if (key == "codec_name") {
      probe.codecs.push_back(value);
    } else if (key == "nb_frames") {
      probe.sampleCounts.push_back(std::atol(value.c_str()));
    } else if (key == "duration") {
      probe.duration = std::atof(value.c_str());
    }
  }
}

} // namespace

bool canProbeMovies() {
  std::string ignored;
  return run("/bin/sh", {"-c", "command -v ffprobe && command -v ffmpeg"}, ignored, ignored) == 0;
}

MovieProbe probeMovie(const std::string& path) {
  MovieProbe probe;
  std::string output;
  run("/usr/bin/env",
      {"ffprobe", "-loglevel", "warning", "-show_entries", "stream=codec_name,nb_frames:format=duration", "-of",
       "default=noprint_wrappers=1", path},
      output, probe.complaints);
  read(output, probe);
  run("/usr/bin/env", {"ffmpeg", "-nostdin", "-loglevel", "error", "-i", path, "-f", "null", "-"}, output,
      probe.complaints);
  return probe;
}

} // namespace lumora::tests
