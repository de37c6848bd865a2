#pragma once

#include <gio/gio.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>

namespace lumora::sandbox {

/// Told why somebody may not; nothing when he may.
using Verdict = std::function<void(const std::optional<std::string>& refusal)>;

/// Decides who may change the configuration.
class Authority {
public:
  virtual ~Authority();

  /// Decides about a caller, named by the connection to the bus, and tells it from the main loop.
  /// \param mayAskTheUser whether the user may be asked for a password
  virtual void check(GDBusConnection& bus, const std::string& caller, const std::string& operation, bool mayAskTheUser,
                     Verdict verdict) = 0;
};

/// polkit, by the machine's policy for the operation.
std::unique_ptr<Authority> polkitAuthority();
/// The superuser and whoever the agent itself runs as, for a bus without polkit.
std::unique_ptr<Authority> ownerAuthority();

} // namespace lumora::sandbox
