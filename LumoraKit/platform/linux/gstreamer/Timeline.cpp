#include <LumoraKit/platform/linux/gstreamer/Timeline.h>

#include <algorithm>

namespace lumora::backend {

Timeline::Timeline(HostTime start) : sections_{{start, open, 0, 0}} {}

void Timeline::pause(HostTime time) {
  if (!paused_ && !stopTime_) {
    close(time);
    paused_ = true;
  }
}

void Timeline::resume(HostTime time) {
  if (!paused_ || stopTime_) {
    return;
  }
  const Span& last = sections_.back();
  const std::uint64_t recorded = last.fileTime + (last.end - last.begin);
  sections_.push_back({std::max(time, last.end), open, recorded, last.resumes + 1});
  paused_ = false;
}

void Timeline::stop(HostTime time) {
  if (stopTime_) {
    return;
  }
  stopTime_ = time;
  if (!paused_) {
    close(time);
  }
}

void Timeline::close(HostTime time) {
  sections_.back().end = std::max(time, sections_.back().begin);
}

std::optional<std::uint64_t> Timeline::fileTime(HostTime time) const {
  for (const Span& section : sections_) {
    if (section.begin <= time && time < section.end) {
      return section.fileTime + (time - section.begin);
    }
  }
  return std::nullopt;
}

std::vector<Timeline::Span> Timeline::spans(HostTime begin, HostTime end) const {
  std::vector<Span> result;
  for (const Span& section : sections_) {
    const HostTime from = std::max(begin, section.begin);
    const HostTime to = std::min(end, section.end);
    if (from < to) {
      result.push_back({from, to, section.fileTime + (from - section.begin), section.resumes});
    }
  }
  return result;
}

} // namespace lumora::backend
