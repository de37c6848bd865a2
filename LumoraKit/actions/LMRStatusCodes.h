#pragma once

#include <LumoraKit/platform/Export.h>

#include <cstdint>
#include <string>

namespace lumora {

/// The message for the user that belongs to an exit status of the tools. The known ones are localised once, when the
/// first is asked for; the general message of all others at each call. Any thread.
LUMORA_INTERNAL std::string messageForStatusCode(std::int64_t status);

/// Localises the messages of the known statuses, unless that was done before.
LUMORA_INTERNAL void prepareStatusMessages();

} // namespace lumora
