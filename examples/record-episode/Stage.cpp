#include "Stage.h"

#include <LumoraKit/LumoraKit.h>

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <iostream>
#include <map>
#include <sstream>

#include <unistd.h>

namespace stage {
namespace {

volatile std::sig_atomic_t interrupted = 0;

// A line that a terminal writes over; elsewhere it would only be noise.
void show(const std::string& line) {
  if (isatty(STDERR_FILENO) != 0) {
    std::cerr << "\r\033[K" << line << std::flush;
  }
}

// One track as ffprobe tells it ("codec_name=h264|width=1280|...") in words.
std::string described(const std::string& track) {
  std::map<std::string, std::string> fact;
  std::istringstream facts(track);
  for (std::string pair; std::getline(facts, pair, '|');) {
    const auto equals = pair.find('=');
    fact[pair.substr(0, equals)] = equals == std::string::npos ? "" : pair.substr(equals + 1);
  }
  const std::string format = fact["codec_type"] == "video"
                                 ? fact["width"] + "x" + fact["height"] + ", " + fact["nb_read_packets"] + " frames"
                                 : fact["sample_rate"] + " Hz, " + fact["channels"] + " channels";
  return fact["codec_type"] + ": " + fact["codec_name"] + ", " + format + ", " + fact["duration"] + " s";
}

} // namespace

TemporaryHome::TemporaryHome() {
  std::string name = std::filesystem::temp_directory_path() / "record-episode-XXXXXX";
  if (mkdtemp(name.data()) == nullptr) {
    throw Failure{"No temporary folder could be made beside " + name + "."};
  }
  path_ = name;
  setenv("XDG_DATA_HOME", (path_ / "data").c_str(), 1);
  setenv("XDG_CONFIG_HOME", (path_ / "config").c_str(), 1);
}

TemporaryHome::~TemporaryHome() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

Server::Server(std::filesystem::path root, const std::string& user, const std::string& password)
    : root_(std::move(root)), machine_(lumora::Platform::current().toolRunner) {
  run(LUMORA_SANDBOX_PROGRAM, {"create", root_, "--user", user, "--full-name", "Ada Lecturer", "--password-file", "-"},
      password);
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(root_, machine_);
  lumora::Platform::install(platform);
}

std::string Server::episodes() const {
  return run(LUMORA_SANDBOX_PROGRAM, {"episodes", root_});
}

std::vector<std::filesystem::path> Server::storedMovies() const {
  std::vector<std::filesystem::path> movies;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(root_)) {
    if (entry.path().extension() == ".mov") {
      movies.push_back(entry.path());
    }
  }
  std::sort(movies.begin(), movies.end());
  return movies;
}

std::vector<std::string> Server::mediaFacts(const std::filesystem::path& movie) const {
  std::istringstream tracks(run("/usr/bin/ffprobe", {"-v", "error", "-count_packets", "-show_entries",
                                                     "stream=codec_type,codec_name,width,height,sample_rate,channels,"
                                                     "nb_read_packets,duration",
                                                     "-of", "compact=print_section=0", movie}));
  std::vector<std::string> lines;
  for (std::string track; std::getline(tracks, track);) {
    lines.push_back(described(track));
  }
  return lines;
}

std::string Server::run(const std::string& program, const std::vector<std::string>& arguments,
                        const std::string& input) const {
  std::string output;
  std::string complaint;
  if (const int status = machine_->run(program, arguments, input, output, complaint); status != 0) {
    throw Failure{program + " ended with status " + std::to_string(status) + ": " + complaint, status};
  }
  return output;
}

void catchInterrupts() {
  struct sigaction action {};
  action.sa_handler = [](int) { interrupted = 1; };
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    sigaction(signal, &action, nullptr);
  }
}

void waitUntil(const std::function<bool()>& condition, const std::function<std::string()>& progress,
               std::chrono::seconds limit) {
  using namespace std::chrono_literals;
  const auto deadline = std::chrono::steady_clock::now() + limit;
  while (!lumora::Platform::current().mainThread->serveUntil(condition, 100ms)) {
    show(progress());
    if (interrupted != 0) {
      interrupted = 0;
      show("");
      throw Failure{"Cancelled.", 130};
    }
    if (std::chrono::steady_clock::now() > deadline) {
      throw Failure{"Nothing happened for " + std::to_string(limit.count()) + " seconds: " + progress()};
    }
  }
  show("");
}

} // namespace stage
