#pragma once

#include "Sources.h"

namespace tester {

/// Prints what was recorded: of each file pictures, lost pictures, lengths and where sound begins against picture, and
/// the offsets between the sources.
void printMeasurements(const std::vector<Source>& sources);

} // namespace tester
