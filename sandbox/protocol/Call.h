#pragma once

#include "Request.h"

#include <cstdint>
#include <span>

namespace lumora::sandbox {

/// Which tool was run. The exec tool takes the same requests as the main tool.
enum class ToolKind { Main, Exec, Action };

/// A server as a request names it.
struct Address {
  std::string host;
  /// 0 stands for the default port.
  std::uint16_t port = 0;
};

/// What a request says about the caller.
struct Credentials {
  Address server;
  /// Absent for single sign-on.
  std::optional<std::string> user;
  std::string password;
};

/// A request taken apart: who asks, for what, and the arguments, which are not looked at yet.
struct Call {
  std::optional<Credentials> credentials;
  /// The command word, or the verb of a remote-camera command.
  std::string command;
  /// A verb is itself the first of the arguments.
  bool isVerb = false;
  std::span<const Element> arguments;
};

/// Takes a request apart. What comes before the arguments must be complete and in its order, or is refused as invalid
/// arguments. The call refers to the elements.
Call parseCall(std::span<const Element> elements, ToolKind tool);

/// Reads "host:port"; anything else is refused as invalid arguments.
Address parseAddress(const std::string& text);

} // namespace lumora::sandbox
