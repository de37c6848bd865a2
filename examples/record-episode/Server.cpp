#include "Server.h"

#include "Stage.h"

#include <LumoraKit/LumoraKit.h>

#include <algorithm>
#include <map>
#include <sstream>

namespace stage {
namespace {

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

std::int64_t sourceIndex(const lumora::Dictionary& episode) {
  const lumora::Value* index = episode.find("source_index");
  return index ? index->integer().value_or(0) : 0;
}

} // namespace

Server::Server(std::filesystem::path root, const std::string& user, const std::string& password)
    : root_(std::move(root)), machine_(lumora::Platform::current().toolRunner) {
  sandbox({"create", root_, "--user", user, "--full-name", "Ada Lecturer", "--password-file", "-"}, password);
  sandbox({"camera", "add", root_, "Studio A"});
  sandbox({"workflow", "add", root_, "lecture-hall", "--title", "Lecture hall", "--source", "Video", "--source",
           "Screen", "--source", "Video"});
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(root_, machine_);
  lumora::Platform::install(platform);
}

std::vector<lumora::Dictionary> Server::episodes() const {
  const auto report = lumora::dictionaryWithXMLDescription(sandbox({"episodes", "--plist", root_}));
  const lumora::Array* entries = report ? report->array("episodes") : nullptr;
  std::vector<lumora::Dictionary> episodes;
  for (const lumora::Value& entry : entries ? *entries : lumora::Array()) {
    episodes.push_back(*entry.dictionary());
  }
  std::sort(episodes.begin(), episodes.end(),
            [](const auto& one, const auto& other) { return sourceIndex(one) < sourceIndex(other); });
  return episodes;
}

std::vector<std::string> Server::mediaFacts(const std::filesystem::path& movie) const {
  static const std::string facts =
      "stream=codec_type,codec_name,width,height,sample_rate,channels,nb_read_packets,duration";
  std::istringstream tracks(run(
      "/usr/bin/ffprobe",
      {"-v", "error", "-count_packets", "-show_entries", facts, "-of", "compact=print_section=0", movie.string()}, {}));
  std::vector<std::string> lines;
  for (std::string track; std::getline(tracks, track);) {
    lines.push_back(described(track));
  }
  return lines;
}

void Server::keepMovies(const std::filesystem::path& folder) const {
  if (folder.empty()) {
    return;
  }
  std::filesystem::create_directories(folder);
  for (const auto& entry : std::filesystem::recursive_directory_iterator(root_)) {
    if (entry.path().extension() == ".mov") {
      std::filesystem::copy_file(entry, folder / entry.path().filename());
    }
  }
}

std::string Server::sandbox(const std::vector<std::string>& arguments, const std::string& input) const {
  return run(LUMORA_SANDBOX_PROGRAM, arguments, input);
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

} // namespace stage
