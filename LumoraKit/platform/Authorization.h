#pragma once

#include <LumoraKit/platform/Value.h>

namespace lumora {

/// A permission for one privileged operation, as the helper agent handed it to the application. Opaque to the
/// framework.
struct Authorization {
  /// As the agent made them; good for one connection of one process only.
  Data bytes;
};

/// How a permission is passed: not owned, so it must outlive the action that carries it. Null: none.
using AuthorizationRef = const Authorization*;

} // namespace lumora
