#pragma once

#include <string>
#include <vector>

namespace lumora::tests {

inline constexpr const char* scriptedServiceRole = "--scripted-service";

/// A Secret Service on the bus of the session with one collection that is locked, in which there is one item: account
/// "ada", secret "apple". What its prompt does is the script:
///
///     agree      it is unlocked
///     refuse     the user refuses
///     hang       nobody answers
///     die        the service ends
///     nonsense   every answer is of another form than it should be
///
/// \param arguments the role and the script
int runScriptedService(const std::vector<std::string>& arguments);

} // namespace lumora::tests
