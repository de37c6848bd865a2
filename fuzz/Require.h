#pragma once

#include <cstdlib>

/// Ends the process when what must hold does not.
inline void require(bool holds) {
  if (!holds) {
    std::abort();
  }
}
