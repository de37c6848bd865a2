#pragma once

#include <string_view>

/// \file
/// What is kept in preferences, and where. The last connection is remembered for each application; the recent
/// connections and the choice to remember passwords are shared by every application that uses the framework.

/// In the application's preferences: the connection record of the last login.
inline constexpr std::string_view LMRSavedConnectionKey = "LMRSavedConnection";
/// In the application's preferences: the folder for local recordings, a path. Written by the application.
inline constexpr std::string_view LMRRecorderDestinationFolder = "RecorderDestinationFolder";

/// In the framework's preferences: a dictionary from server to the connection record of the last login there.
inline constexpr std::string_view LMRRecentConnectionsKey = "RecentConnections";

namespace lumora {
/// In the framework's preferences: whether the user wants passwords remembered, a boolean. Absent: no.
inline constexpr std::string_view SavePasswordInKeychainKey = "SavePasswordInKeychain";
} // namespace lumora

/// In a connection record: the host name that the session connected to.
inline constexpr std::string_view LMRSavedConnectionServerKey = "server";
/// The session's LMRAuthenticationType, an integer.
inline constexpr std::string_view LMRSavedConnectionAuthenticationTypeKey = "type";
/// The port as the user entered it, an integer; 0 is the default port.
inline constexpr std::string_view LMRSavedConnectionPortKey = "port";
/// The session's user name.
inline constexpr std::string_view LMRSavedConnectionUserNameKey = "userName";
