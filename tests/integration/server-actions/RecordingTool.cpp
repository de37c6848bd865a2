#include "RecordingTool.h"

#include <LumoraKit/platform/RootedToolRunner.h>

#include <cstdlib>
#include <filesystem>

namespace lumora::tests {
namespace {

// The folder of the notes and of the answer is put in front.
constexpr std::string_view script = R"(printf '%s\n' "$0" "$@" > "$folder/command-line"
cat > "$folder/request"
cat "$folder/output"
cat "$folder/error" >&2
read -r status < "$folder/status"
exit "$status"
)";

} // namespace

RecordingToolTest::RecordingToolTest() : previous_(Platform::current()) {
  Platform platform = previous_;
  platform.application = std::make_shared<fakes::FakeApplication>();
  platform.log = log_;
  platform.toolRunner = std::make_shared<RootedToolRunner>(folder_ / "root", previous_.toolRunner);
  Platform::install(platform);
  ::setenv("XDG_DATA_HOME", (folder_ / "data").c_str(), 1);
  install("/usr/bin/lumctl");
  answer(0, "");
}

RecordingToolTest::~RecordingToolTest() {
  ::unsetenv("XDG_DATA_HOME");
  Platform::install(previous_);
}

void RecordingToolTest::install(std::string_view toolPath) const {
  const std::filesystem::path tool = folder_ / "root" / toolPath.substr(1);
  std::filesystem::create_directories(tool.parent_path());
  writeFile(tool, "#!/bin/sh\nfolder='" + folder_.path().string() + "'\n" + std::string(script));
  std::filesystem::permissions(tool, std::filesystem::perms::owner_all);
}

void RecordingToolTest::answer(int status, std::string_view standardOutput, std::string_view standardError) const {
  writeFile(folder_ / "output", standardOutput);
  writeFile(folder_ / "error", standardError);
  writeFile(folder_ / "status", std::to_string(status) + "\n");
}

std::string requestText(std::string_view elements) {
  std::string text = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<plist version=\"1.0\">\n<array>\n";
  return text.append(elements).append("</array>\n</plist>\n");
}

} // namespace lumora::tests
