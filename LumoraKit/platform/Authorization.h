#pragma once

#include <LumoraKit/platform/Value.h>

namespace lumora {

/// A permission for one privileged operation, as the helper agent handed it to the application. Opaque to the
/// framework.
struct Authorization {
  Data bytes;
};

/// How a permission is passed: not owned, so it must outlive the action that carries it. Null: none.
using AuthorizationRef = const Authorization*;

} // namespace lumora
