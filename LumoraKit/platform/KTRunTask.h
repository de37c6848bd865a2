#pragma once

#include <LumoraKit/platform/Export.h>

#include <string>
#include <vector>

namespace lumora {

/// Runs command-line tools. Implementations are called from many threads at once.
class LUMORA_EXPORT ToolRunner {
public:
  virtual ~ToolRunner();

  /// Runs the executable to its end with the text on its standard input. Blocks the calling thread.
  /// \param executable absolute path
  /// \param arguments without the program's name
  /// \param standardOutput,standardError receive everything the tool wrote, byte for byte
  /// \return the exit status; 128+n for a tool that died of signal n; 127, with the reason at the end of the standard
  ///   error, for one that could not be started, or whose input or outputs the system has lost
  virtual int run(const std::string& executable, const std::vector<std::string>& arguments,
                  const std::string& standardInput, std::string& standardOutput, std::string& standardError) = 0;
};

} // namespace lumora

/// Runs a tool with the platform's runner; see lumora::ToolRunner::run. The last parameter is reserved: pass null.
/// Either place for an output may be null. Blocks.
LUMORA_EXPORT int KTRunTask(const std::string& executable, const std::vector<std::string>& arguments,
                            const std::string& standardInput, std::string* standardOutput, std::string* standardError,
                            void* reserved);
