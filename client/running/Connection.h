#pragma once

#include "../grammar/CommandLine.h"

namespace lumora::client {

/// Which server, from --server, --port and LUMORA_SERVER.
struct ServerAddress {
  std::string host;
  /// 0 when none was named
  std::uint16_t port = 0;

  static ServerAddress of(const CommandLine& line);
  /// "host", "host:port", "[::1]:port"; nothing when it is none of them.
  static std::optional<ServerAddress> parse(const std::string& text);
};

/// From --user, LUMORA_USER, or who is logged in to this machine.
std::string userName(const CommandLine& line);

/// A value of the environment; nothing when it is unset or empty. Invalid UTF-8 is a Failure.
std::optional<std::string> environmentValue(const char* name);

} // namespace lumora::client
