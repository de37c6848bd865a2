#pragma once

#include <LumoraKit/LumoraKit.h>

#include <optional>
#include <string>

namespace lumora::client {

/// Asks at the program's terminal, whatever its standard input and outputs are, without showing what is typed. The
/// terminal is as before when it returns or throws. Nothing when there is no terminal. A signal that ends the program
/// is thrown as an Interruption, the end of input is a Failure.
std::optional<Secret> askForPassword(const std::string& prompt);

} // namespace lumora::client
