#include <LumoraKit/testing/RecordingLog.h>

#include <algorithm>

namespace lumora::fakes {

RecordingLog::RecordingLog() = default;
RecordingLog::~RecordingLog() = default;

void RecordingLog::write(std::string_view line) {
  const std::lock_guard lock(mutex_);
  lines_.emplace_back(line);
}

std::vector<std::string> RecordingLog::lines() const {
  const std::lock_guard lock(mutex_);
  return lines_;
}

std::size_t RecordingLog::count(std::string_view text) const {
  const std::lock_guard lock(mutex_);
  const auto holdsText = [text](const std::string& line) { return line.find(text) != std::string::npos; };
  return static_cast<std::size_t>(std::count_if(lines_.begin(), lines_.end(), holdsText));
}

void RecordingLog::clear() {
  const std::lock_guard lock(mutex_);
  lines_.clear();
}

} // namespace lumora::fakes
