#include "Helper.h"
#include "support/TemporaryFolder.h"

#include <gmock/gmock.h>

#include <csignal>
#include <filesystem>

#include <sys/resource.h>

namespace lumora::tests {
namespace {

using testing::EndsWith;

// Lets no more descriptors be opened than those that are.
class NoMoreDescriptors {
public:
  NoMoreDescriptors() {
    getrlimit(RLIMIT_NOFILE, &previous_);
    rlimit limit = previous_;
    limit.rlim_cur = 0;
    setrlimit(RLIMIT_NOFILE, &limit);
  }
  NoMoreDescriptors(const NoMoreDescriptors&) = delete;
  NoMoreDescriptors& operator=(const NoMoreDescriptors&) = delete;
  ~NoMoreDescriptors() { setrlimit(RLIMIT_NOFILE, &previous_); }

private:
  rlimit previous_{};
};

std::string executableFile(const TemporaryFolder& folder, std::string_view content) {
  const auto path = folder / "tool";
  writeFile(path, content);
  std::filesystem::permissions(path, std::filesystem::perms::owner_all);
  return path.string();
}

TEST(ToolStatus, isExitCode_whenToolExits) {
  for (const int code : {0, 1, 26, 126, 255}) {
    EXPECT_EQ(runShell("exit " + std::to_string(code)).status, code);
  }
}

TEST(ToolStatus, is128PlusSignal_whenToolDiesOfSignal) {
  for (const int signal : {SIGTERM, SIGKILL, SIGPIPE, SIGABRT}) {
    EXPECT_EQ(runHelper({"die", std::to_string(signal)}).status, 128 + signal);
  }
}

TEST(ToolStatus, is127WithReason_whenToolIsMissing) {
  const auto done = run("/nowhere/tool", {});
  EXPECT_EQ(done.status, 127);
  EXPECT_EQ(done.error, "/nowhere/tool: No such file or directory");
  EXPECT_EQ(done.output, "");
}

TEST(ToolStatus, is127WithReason_whenToolIsNotExecutable) {
  const auto done = run("/etc/passwd", {});
  EXPECT_EQ(done.status, 127);
  EXPECT_EQ(done.error, "/etc/passwd: Permission denied");
}

TEST(ToolStatus, is127WithReason_whenToolIsFolder) {
  const auto done = run("/tmp", {});
  EXPECT_EQ(done.status, 127);
  EXPECT_EQ(done.error, "/tmp: Permission denied");
}

TEST(ToolStatus, is127WithReason_whenToolIsNoProgram) {
  const TemporaryFolder folder;
  const auto done = run(executableFile(folder, "no program\n"), {});
  EXPECT_EQ(done.status, 127);
  EXPECT_THAT(done.error, EndsWith(": Exec format error"));
}

TEST(ToolStatus, is127WithReason_whenInterpreterIsMissing) {
  const TemporaryFolder folder;
  EXPECT_EQ(run(executableFile(folder, "#!/nowhere/interpreter\n"), {}).status, 127);
}

TEST(ToolStatus, is127WithReason_whenPathIsEmpty) {
  EXPECT_EQ(run("", {}).status, 127);
}

TEST(ToolStatus, is127WithReason_whenDescriptorsRunOut) {
#ifdef __SANITIZE_ADDRESS__
  GTEST_SKIP() << "the undefined-behaviour sanitizer needs a pipe to check an object's type";
#endif
  ToolRun done{};
  {
    const NoMoreDescriptors limit;
    done = run("/bin/true", {});
  }
  EXPECT_EQ(done.status, 127);
  EXPECT_EQ(done.error, "/bin/true: Too many open files");
}

TEST(ToolStatus, is127WithReason_whenArgumentsAreTooLong) {
  const auto done = run("/bin/true", {std::string(std::size_t{4} << 20U, 'x')});
  EXPECT_EQ(done.status, 127);
  EXPECT_EQ(done.error, "/bin/true: Argument list too long");
}

TEST(ToolStatus, is127WithReason_whenApplicationIgnoresChildren) {
  const auto done = runHelper({"ignore-children"});
  EXPECT_EQ(done.status, 127);
  EXPECT_EQ(done.output, "/bin/true: the exit status was taken by another wait");
}

TEST(ToolRun, replacesFormerOutputs) {
  std::string output = "former output";
  std::string error = "former error";
  EXPECT_EQ(backend::PosixToolRunner().run("/bin/echo", {"new"}, "", output, error), 0);
  EXPECT_EQ(output, "new\n");
  EXPECT_EQ(error, "");
}

TEST(ToolRun, passesPathAndArgumentsUnchanged) {
  const auto done = run("/bin/sh", {"-c", R"(printf '%s|' "$0" "$@")", "a b", "", "*", "ü\n"});
  EXPECT_EQ(done.output, "a b||*|ü\n|");
  EXPECT_EQ(run("/bin/sh", {"-c", "exec cat /proc/$$/cmdline"}).output.substr(0, 4), std::string("cat\0", 4));
}

TEST(ToolRun, givesToolTheEnvironmentAndWorkingFolder) {
  ASSERT_EQ(setenv("LUMORA_TEST_VARIABLE", "value", 1), 0);
  const auto done = runShell("echo $LUMORA_TEST_VARIABLE; pwd -P");
  EXPECT_EQ(done.output, "value\n" + std::filesystem::current_path().string() + "\n");
}

} // namespace
} // namespace lumora::tests
