#pragma once

#include "Store.h"

#include <optional>
#include <string>
#include <utility>
#include <vector>

/// \file
/// Kerberos: the server's own key, and which principal is which user.

namespace lumora::sandbox {

/// The principal that callers need a ticket for ("lumora/HOST@REALM"); nothing when there is no single sign-on.
std::optional<std::string> singleSignOnService(Store& store);
/// Where the service's key lies.
std::filesystem::path keytabPath(const Store& store);

/// Offers single sign-on with a copy of the keytab.
void enableSingleSignOn(Store& store, const std::filesystem::path& keytab, const std::string& service);
void disableSingleSignOn(Store& store);

/// Lets the principal log in as the user, and as no other.
void mapPrincipal(Store& store, const std::string& principal, const std::string& user);
/// False when it was no one's.
bool unmapPrincipal(Store& store, const std::string& principal);
/// Each principal with its user.
std::vector<std::pair<std::string, std::string>> principals(Store& store);
/// The name of the principal's user.
std::optional<std::string> userOfPrincipal(Store& store, const std::string& principal);

} // namespace lumora::sandbox
