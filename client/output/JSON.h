#pragma once

#include <LumoraKit/LumoraKit.h>

#include <string>

namespace lumora::client {

/// A value as JSON (RFC 8259), indented, with a line end. Dates are strings of ISO 8601 in UTC, data are strings of
/// base64, and the reals that JSON has no number for are the strings "NaN", "Infinity" and "-Infinity". Any nesting,
/// without recursion.
std::string json(const Value& value);

} // namespace lumora::client
