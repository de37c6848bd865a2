#pragma once

#include "Options.h"
#include "Sources.h"

namespace tester {

/// From now on Ctrl-C ends a recording in place of the process.
void catchInterrupts();

/// Records the sources as one, with the pauses, until the time is over or Ctrl-C; then the files are complete. A source
/// that fails is a Failure; the files are finished all the same.
void record(const std::vector<Source>& sources, const Options& options);

} // namespace tester
