#pragma once

#include "Store.h"

/// \file
/// The server's master password. A server need not have one.

namespace lumora::sandbox {

void setMasterPassword(Store& store, const std::string& password);

/// Refuses a password that is not the server's, where the server has one, and the lack of one where it is required.
void checkMasterPassword(Store& store, const std::optional<std::string>& password, bool isRequired);

} // namespace lumora::sandbox
