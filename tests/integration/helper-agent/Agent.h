#pragma once

namespace lumora::tests {

/// A helper agent whose commands go wrong in every way, for whoever runs it. It prints "ready", and then each command
/// as it begins with it:
///   "echo"       replies with the request
///   "setconfig"  replies with status 0 and the first argument under "changed"
///   "bind"       replies with status 35 and a standard error
///   "crash"      ends the agent
///   "hang"       never replies
///   "fail"       replies with an error of the agent's own
///   "garbage", "array", "number"  reply with what is no property list, no dictionary, no text
int runAgent();

} // namespace lumora::tests
