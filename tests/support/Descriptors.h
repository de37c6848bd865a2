#pragma once

#include <cstddef>

/// \file
/// What this process holds of the system's resources at this moment.

namespace lumora::tests {

/// The number of open descriptors, without the one that counting takes.
std::size_t openDescriptors();
std::size_t threadCount();
/// Resident memory in bytes: now, and the most there ever was.
std::size_t residentMemory();
std::size_t peakResidentMemory();
/// Whether resident memory is the program's own: a sanitizer keeps much of what was freed.
bool memoryCanBeMeasured();

} // namespace lumora::tests
