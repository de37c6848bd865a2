#pragma once

#include <LumoraKit/platform/Log.h>

#include <cstddef>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

namespace lumora::fakes {

/// A log that keeps its lines. Any thread.
class LUMORA_EXPORT RecordingLog final : public Log {
public:
  RecordingLog();
  ~RecordingLog() override;

  void write(std::string_view line) override;

  /// The lines so far, in their order.
  std::vector<std::string> lines() const;
  /// How many lines hold this text.
  std::size_t count(std::string_view text) const;
  /// Whether a line holds this text.
  bool contains(std::string_view text) const { return count(text) > 0; }
  /// Forgets the lines so far.
  void clear();

private:
  mutable std::mutex mutex_;
  std::vector<std::string> lines_;
};

} // namespace lumora::fakes
