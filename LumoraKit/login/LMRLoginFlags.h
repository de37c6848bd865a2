#pragma once

#include <LumoraKit/platform/KTAction.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

/// Small questions that the login controllers ask.
namespace LMRLoginFlags {

/// In the user information of a single sign-on that nobody asked for: true.
inline constexpr std::string_view AutomaticLoginKey = "AutomaticLogin";

/// Whether the value is the boolean true or a number other than 0; false for null.
LUMORA_INTERNAL bool isTrue(const lumora::Value* value);

/// Whether the action is such a single sign-on; false for null.
LUMORA_INTERNAL bool isAutomaticLogin(const KTActionRef& action);

/// The number that the text begins with, as strtoll(3) finds it, in its lower 16 bits; 0 without one.
LUMORA_INTERNAL std::uint16_t portFromText(const std::string& text);

LUMORA_INTERNAL bool isEmpty(const std::optional<std::string>& text);

} // namespace LMRLoginFlags
