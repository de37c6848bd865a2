#pragma once

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/Secret.h>
#include <LumoraKit/platform/Value.h>

#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// \file
/// How requests to the tools are put together.

namespace lumora {

/// The argument ("key", value), or ("key") when the value is absent: lists end at their first absent element.
LUMORA_INTERNAL Value requestPair(std::string_view key, std::optional<Value> value);

/// "host:port".
LUMORA_INTERNAL std::string hostAndPort(const std::optional<std::string>& host, std::uint16_t port);

/// What one run of a tool asks for.
struct LUMORA_INTERNAL Request {
  std::string tool;
  std::optional<std::string> command;
  std::optional<Array> arguments;
  std::shared_ptr<LMRSession> session;

  /// The property list for the tool's standard input. Nothing, with the reason set, when no property list can carry
  /// it; the reason gives nothing of the request away.
  std::optional<Secret> serialised(std::string& reason) const;
};

} // namespace lumora
