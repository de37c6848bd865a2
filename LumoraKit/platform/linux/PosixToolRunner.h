#pragma once

#include <LumoraKit/platform/KTRunTask.h>

namespace lumora::backend {

/// Runs tools as child processes. Keeps no state: any number of runs at once, from any threads.
class LUMORA_INTERNAL PosixToolRunner final : public ToolRunner {
public:
  int run(const std::string& executable, const std::vector<std::string>& arguments, const std::string& standardInput,
          std::string& standardOutput, std::string& standardError) override;
};

} // namespace lumora::backend
