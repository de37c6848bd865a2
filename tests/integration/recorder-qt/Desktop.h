#pragma once

#include "support/HeadlessDevices.h"

#include <memory>
#include <string>

namespace recorder {

/// The devices of all tests, and why there are none.
struct Desktop {
  std::unique_ptr<lumora::testing::HeadlessDevices> devices;
  std::string missing;
};
Desktop& desktop();

} // namespace recorder
