#pragma once

/// \file
/// Symbol visibility. The library is built with hidden visibility; what an application may use carries
/// LUMORA_EXPORT. LUMORA_INTERNAL marks what only the framework and its own tests use: it is exported in builds
/// with tests (LUMORAKIT_EXPORT_INTERNALS) and hidden in packaged ones.

/// Makes a class or function of the library usable by applications.
#define LUMORA_EXPORT __attribute__((visibility("default")))

/// Makes it usable by the framework's own tests, in builds with tests only.
#ifdef LUMORAKIT_EXPORT_INTERNALS
#define LUMORA_INTERNAL LUMORA_EXPORT
#else
#define LUMORA_INTERNAL
#endif
