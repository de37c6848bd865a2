#include <LumoraKit/platform/RootedToolRunner.h>

#include <system_error>
#include <utility>

namespace lumora {
namespace {

std::filesystem::path absolutePath(const std::filesystem::path& path) {
  std::error_code error;
  auto absolute = std::filesystem::absolute(path, error);
  return error ? path : absolute;
}

} // namespace

RootedToolRunner::RootedToolRunner(const std::filesystem::path& root, std::shared_ptr<ToolRunner> runner)
    : root_(absolutePath(root)), runner_(std::move(runner)) {}

int RootedToolRunner::run(const std::string& executable, const std::vector<std::string>& arguments,
                          const std::string& standardInput, std::string& standardOutput, std::string& standardError) {
  const auto underRoot = root_ / std::filesystem::path(executable).relative_path();
  return runner_->run(underRoot.string(), arguments, standardInput, standardOutput, standardError);
}

} // namespace lumora
