#pragma once

#include "Invocation.h"

namespace lumora::sandbox {

/// The programs lumctl, lumexec and lumaction: request on standard input, reply on standard output. The exit status.
int runTool(const Invocation& invocation, int argc, char** argv);

} // namespace lumora::sandbox
