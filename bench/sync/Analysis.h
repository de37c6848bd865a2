#pragma once

#include "Recording.h"

#include <map>
#include <optional>

namespace lumora::bench {

/// When the flashes and beeps are in a file, in seconds of the file by the host time at which they began. Only those
/// that lie wholly between two pauses.
using Onsets = std::map<HostTime, double>;

/// The flashes that the first file's source must have seen: host time, and how many pauses came before it.
std::map<HostTime, std::size_t> flashesIn(const RecordedFile& file);

/// Read from the pictures; from the sound. A flash that cannot be found about where it is to be expected is left out.
Onsets lightOnsets(const RecordedFile& file);
Onsets soundOnsets(const RecordedFile& file);

/// Pictures at 30 a second that are missing between two others, or before the first, or after the last.
long lostPictures(const RecordedFile& file);

} // namespace lumora::bench
