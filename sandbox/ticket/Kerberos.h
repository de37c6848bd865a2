#pragma once

#include <stdexcept>
#include <string>

/// \file
/// What the ticket program does with the Kerberos 5 library (RFC 4120).

namespace lumora::sandbox {

/// Why a ticket is not good: the tool's exit status and the reason for its standard error.
class TicketRefusal : public std::runtime_error {
public:
  TicketRefusal(int status, const std::string& reason) : std::runtime_error(reason), status_(status) {}
  int status() const { return status_; }

private:
  int status_;
};

/// The service whose key is in the keytab: the first principal there that is named "lumora/...". Throws a
/// TicketRefusal.
std::string serviceInKeytab(const std::string& keytab);

/// Whose ticket the caller holds. Gets a ticket for the service from the caller's credential cache, asking the Kerberos
/// server when none is there yet, and decrypts it with the service's key. Throws a TicketRefusal.
std::string principalOfCaller(const std::string& keytab, const std::string& service);

} // namespace lumora::sandbox
