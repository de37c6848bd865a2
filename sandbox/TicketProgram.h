#pragma once

#include "store/Users.h"

#include <filesystem>
#include <string>

namespace lumora::sandbox {

/// The service whose key is in the keytab; throws a Refusal when there is none.
std::string serviceInKeytab(const std::filesystem::path& keytab);

/// The user whose Kerberos ticket for this server the process's own user holds; throws a Refusal.
User userWithTicket(Store& store);

} // namespace lumora::sandbox
