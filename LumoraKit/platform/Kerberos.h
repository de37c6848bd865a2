#pragma once

#include <LumoraKit/platform/Export.h>

#include <cstdint>
#include <string>

namespace lumora {

/// The status of a machine without Kerberos.
inline constexpr std::int32_t KerberosNotAvailable = -1;

/// What the framework asks of Kerberos 5 (RFC 4120). Any thread, several at once.
class LUMORA_EXPORT Kerberos {
public:
  virtual ~Kerberos();

  /// The name of the realm that the machine belongs to. Blocks: it may have to ask name servers.
  /// \param name receives the realm's name, which may be empty; empty after a failure
  /// \return 0, or the library's error code; KerberosNotAvailable when there is no library
  virtual std::int32_t defaultRealm(std::string& name) = 0;
};

} // namespace lumora
