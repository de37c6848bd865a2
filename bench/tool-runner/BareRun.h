#pragma once

#include <string>
#include <vector>

namespace lumora::bench {

/// The least that runs a tool and returns its outputs: three pipes, posix_spawn, one loop of poll, read and append,
/// waitpid. It takes care of nothing that can go wrong. The input must be short enough for a pipe.
void bareRun(const std::string& executable, const std::vector<std::string>& arguments, const std::string& standardInput,
             std::string& standardOutput, std::string& standardError);

} // namespace lumora::bench
