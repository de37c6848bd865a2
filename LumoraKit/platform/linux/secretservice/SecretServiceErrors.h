#pragma once

#include <LumoraKit/platform/CredentialStore.h>

#include <gio/gio.h>

namespace lumora::backend {

/// What a failed call of the Secret Service means for its caller.
LMRErrorRef secretServiceError(const GError& error);

/// The service gave an answer of another form than the protocol says.
LMRErrorRef secretServiceMisunderstood();

} // namespace lumora::backend
