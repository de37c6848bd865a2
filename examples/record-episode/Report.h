#pragma once

#include "Server.h"

#include <LumoraKit/LumoraKit.h>

#include <map>

namespace stage {

/// When each source began to record, for the offsets between the parts of the episode.
class Beginnings {
public:
  /// Call it when all of them record.
  explicit Beginnings(const std::vector<std::shared_ptr<LMRSourceRecorder>>& sources);

  /// Seconds after the first source; of a local one where its file begins, of a remote one when the server had
  /// replied that it records.
  double offset(std::size_t source) const { return offsets_.at(source); }

private:
  std::vector<double> offsets_;
};

/// Prints the finished episode: each part with its source, duration, beginning and media facts.
void printEpisode(const Server& server, const std::vector<std::string>& sourceNames, const Beginnings& beginnings);

/// For a person: "6.04 s".
std::string seconds(double value);

} // namespace stage
