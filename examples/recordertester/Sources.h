#pragma once

#include "Options.h"

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <string>
#include <vector>

namespace tester {

/// One thing that is recorded into one file.
struct Source {
  std::string name;
  std::shared_ptr<LMRLocalVideoRecorder> recorder;
};

/// Opens what the options ask for; the sessions run. The files have plain names, "camera-1.mov", in the options'
/// folder, and replace none. A device that cannot be had is a Failure.
std::vector<Source> openSources(const Options& options);

/// After bootstrap(), which chooses names of its own.
void nameFiles(const std::vector<Source>& sources, const std::filesystem::path& folder);

} // namespace tester
