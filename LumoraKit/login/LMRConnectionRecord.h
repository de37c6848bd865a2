#pragma once

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/Value.h>

#include <cstdint>

/// Connection records: what preferences remember of a login, under the LMRSavedConnection...Key keys.
namespace LMRConnectionRecord {

/// The record of a session: server, type, port and user name in this order, ending before the first that is absent.
/// \param port the port as the user entered it
LUMORA_INTERNAL lumora::Dictionary recordWithSession_port(const LMRSession& session, std::uint16_t port);

/// Puts the record into the framework's recent connections, in place of the one of the same server; the records of
/// other servers stay. A record without a server is dropped. Any thread; of several processes that remember at once,
/// the last wins.
LUMORA_INTERNAL void rememberRecentConnection(const lumora::Dictionary& record);

} // namespace LMRConnectionRecord
