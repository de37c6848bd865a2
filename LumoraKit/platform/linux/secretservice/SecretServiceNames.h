#pragma once

/// \file
/// The names of freedesktop.org's Secret Storage interfaces (Secret Service API draft 0.2).

namespace lumora::backend::secret_service {

inline constexpr const char* serviceName = "org.freedesktop.secrets";
inline constexpr const char* servicePath = "/org/freedesktop/secrets";
inline constexpr const char* serviceInterface = "org.freedesktop.Secret.Service";
inline constexpr const char* collectionInterface = "org.freedesktop.Secret.Collection";
inline constexpr const char* itemInterface = "org.freedesktop.Secret.Item";
inline constexpr const char* promptInterface = "org.freedesktop.Secret.Prompt";
/// The path that stands for no object.
inline constexpr const char* noObject = "/";

} // namespace lumora::backend::secret_service
