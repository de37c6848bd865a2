#pragma once

#include "recorder/model/SourceDescription.h"

#include <LumoraKit/LumoraKit.h>

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace recorder {

/// One of the recordings that a workflow takes.
struct Place {
  std::vector<SourceKind> kinds;

  bool takes(SourceKind kind) const;
};

/// A workflow that this application can record for.
struct Workflow {
  std::string title;
  std::string uuid;
  std::vector<Place> places;

  /// Nothing when it takes something else than one recording, or two of a camera or a screen.
  static std::optional<Workflow> withDescription(const lumora::Dictionary& description);

  /// Which source each place gets, as an index into the sources: each source once, the first that fit. Nothing when
  /// there are not enough.
  std::optional<std::vector<std::size_t>> fed(const SourceDescriptions& sources) const;
};

} // namespace recorder
