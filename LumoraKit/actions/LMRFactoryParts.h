#pragma once

#include <LumoraKit/actions/LMRAction.h>

#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// \file
/// What the factory methods have in common.

namespace lumora {

/// Checks what a factory method must be given.
LUMORA_INTERNAL void requireForFactory(bool holds, std::string_view condition, std::string_view operation);

/// An action of the main tool.
/// \param progressKey key of its progress text
LUMORA_INTERNAL std::shared_ptr<LMRAction> toolAction(std::optional<std::string> command,
                                                      std::optional<Array> arguments,
                                                      std::shared_ptr<LMRSession> session,
                                                      std::string_view progressKey);

} // namespace lumora
