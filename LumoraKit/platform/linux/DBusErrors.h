#pragma once

#include <LumoraKit/platform/KTHelperAgent.h>

#include <gio/gio.h>

#include <string>

namespace lumora::backend {

LUMORA_INTERNAL LMRErrorRef helperAgentError(HelperAgentError code, std::string text);

/// Whether an error of the bus (a code of G_DBUS_ERROR) says that nobody serves the name and nobody could be started.
bool meansNoService(int code);

/// What a failed call of an agent means for its caller.
LUMORA_INTERNAL LMRErrorRef helperAgentCallError(const GError& error, const std::string& agent);

} // namespace lumora::backend
