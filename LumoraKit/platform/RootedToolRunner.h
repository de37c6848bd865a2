#pragma once

#include <LumoraKit/platform/KTRunTask.h>

#include <filesystem>
#include <memory>

namespace lumora {

/// Looks the tools up under a root folder: "/usr/bin/lumctl" is run as "<root>/usr/bin/lumctl" by another runner. With
/// it the framework reaches a server's tools that are installed apart from the system's:
///
///     auto platform = lumora::Platform::current();
///     platform.toolRunner = std::make_shared<lumora::RootedToolRunner>("/srv/test-server", platform.toolRunner);
///     lumora::Platform::install(platform);
///
/// Any thread.
class LUMORA_EXPORT RootedToolRunner final : public ToolRunner {
public:
  /// A relative root counts from the working directory at this moment.
  RootedToolRunner(const std::filesystem::path& root, std::shared_ptr<ToolRunner> runner);

  int run(const std::string& executable, const std::vector<std::string>& arguments, const std::string& standardInput,
          std::string& standardOutput, std::string& standardError) override;

private:
  std::filesystem::path root_;
  std::shared_ptr<ToolRunner> runner_;
};

} // namespace lumora
