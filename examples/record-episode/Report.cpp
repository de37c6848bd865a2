#include "Report.h"

#include "Stage.h"

#include <algorithm>
#include <chrono>
#include <iomanip>
#include <iostream>
#include <sstream>

namespace stage {
namespace {

using Seconds = std::chrono::duration<double>;

// Seconds ago. A local source knows where on the host clock its file begins.
double age(const LMRSourceRecorder& source) {
  const auto* const local = dynamic_cast<const LMRLocalVideoRecorder*>(&source);
  if (local && !local->hostTimesOfFile().empty()) {
    const lumora::HostTime now = lumora::Platform::current().mediaCapture->hostTime();
    return static_cast<double>(now - local->hostTimesOfFile().front()) / 1e9;
  }
  const lumora::WallTime now = lumora::Platform::current().wallClock->now();
  return Seconds(now - source.mostRecentStartDate().value_or(now)).count();
}

const lumora::Dictionary& fileOf(const lumora::Dictionary& episode) {
  const lumora::Array* const files = episode.array("files");
  if (!files || files->empty()) {
    throw Failure{"An episode arrived without a file."};
  }
  return *files->front().dictionary();
}

void printHeading(const std::vector<lumora::Dictionary>& episodes) {
  const lumora::Dictionary& first = episodes.front();
  std::cout << "\nThe episode \"" << first.string("title").value_or("") << "\" for the workflow "
            << first.string("workflow").value_or("") << ", " << episodes.size() << " parts of the recording "
            << first.string("recording_uuid").value_or("(none)") << ":\n";
}

// As the source's recording metadata tell it.
std::string durationOf(const lumora::Dictionary& episode) {
  const lumora::Dictionary* const recording = episode.dictionary("recording_metadata");
  const auto duration = recording ? recording->string(LMREpisodeRecordingMetadataDurationKey) : std::nullopt;
  return duration ? seconds(std::stod(*duration)) : "(the server does not say how long)";
}

std::string milliseconds(double value) {
  std::ostringstream text;
  text << std::fixed << std::setprecision(2) << value * 1e3 << " ms";
  return text.str();
}

} // namespace

Beginnings::Beginnings(const std::vector<std::shared_ptr<LMRSourceRecorder>>& sources) {
  for (const auto& source : sources) {
    offsets_.push_back(-age(*source));
  }
  const double first = *std::min_element(offsets_.begin(), offsets_.end());
  for (double& offset : offsets_) {
    offset -= first;
  }
}

void printEpisode(const Server& server, const std::vector<std::string>& sourceNames, const Beginnings& beginnings) {
  const auto episodes = server.episodes();
  if (episodes.size() != sourceNames.size()) {
    throw Failure{std::to_string(episodes.size()) + " of " + std::to_string(sourceNames.size()) + " parts arrived."};
  }
  printHeading(episodes);
  for (std::size_t part = 0; part < episodes.size(); ++part) {
    const lumora::Dictionary& file = fileOf(episodes[part]);
    std::cout << "\n  " << part + 1 << ". " << sourceNames[part] << "\n"
              << "     recorded " << durationOf(episodes[part]) << ", begins " << milliseconds(beginnings.offset(part))
              << " after the first\n"
              << "     " << file.string("name").value_or("") << "\n";
    for (const std::string& track : server.mediaFacts(file.string("path").value_or(""))) {
      std::cout << "     " << track << "\n";
    }
  }
}

std::string seconds(double value) {
  std::ostringstream text;
  text << std::fixed << std::setprecision(3) << value << " s";
  return text.str();
}

} // namespace stage
