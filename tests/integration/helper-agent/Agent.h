#pragma once

#include <string>
#include <vector>

namespace lumora::tests {

/// A helper agent for tests, as the machine's service org.vantor.lumagentconfigd. It hands out authorizations to whom
/// polkit allows it, or with the argument "--trust-everyone" to all, and takes each only from the connection that it
/// was handed out to. It prints "ready", and then each command as it begins with it:
///   "echo"       replies with the request
///   "setconfig"  replies with status 0 and the first argument under "changed"
///   "bind"       replies with status 35 and a standard error
///   "crash"      ends the agent
///   "hang"       never replies
///   "fail"       replies with an error of the agent's own
///   "garbage", "array", "number"  reply with what is no property list, no dictionary, no text
int runAgent(const std::vector<std::string>& arguments);

} // namespace lumora::tests
