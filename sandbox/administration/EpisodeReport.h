#pragma once

#include "../store/Episodes.h"

namespace lumora::sandbox {

/// The episodes for a reader's eyes.
std::string report(Store& store, const std::vector<Episode>& episodes);
/// The same as a value: a dictionary with the array "episodes".
Dictionary describe(Store& store, const std::vector<Episode>& episodes);

} // namespace lumora::sandbox
