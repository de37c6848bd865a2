#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/Platform.h>

namespace lumora {

ToolRunner::~ToolRunner() = default;

} // namespace lumora

int KTRunTask(const std::string& executable, const std::vector<std::string>& arguments,
              const std::string& standardInput, std::string* standardOutput, std::string* standardError,
              void* /*reserved*/) {
  std::string unwantedOutput;
  std::string unwantedError;
  return lumora::Platform::current().toolRunner->run(executable, arguments, standardInput,
                                                     standardOutput ? *standardOutput : unwantedOutput,
                                                     standardError ? *standardError : unwantedError);
}
