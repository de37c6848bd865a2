#pragma once

#include "Store.h"

#include <utility>
#include <vector>

/// \file
/// How this machine records for the server as a remote recorder: what "getconfig" tells and "setconfig" changes.

namespace lumora::sandbox {

constexpr const char* cameraNameKey = "CameraName";
constexpr const char* serverHostKey = "TunnelHost";

bool isConfigurationKey(const std::string& key);
/// Every key with its value, which is empty until it was set.
std::vector<std::pair<std::string, std::string>> configuration(Store& store);
void configure(Store& store, const std::string& key, const std::string& value);

} // namespace lumora::sandbox
