#include "Requests.h"

#include <LumoraKit/platform/Platform.h>

using namespace lumora;
using namespace lumora::tests;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

namespace {

ProgramRun run(const std::filesystem::path& program, const std::vector<std::string>& arguments,
               const std::string& input = {}) {
  ProgramRun result;
  result.status = Platform::current().toolRunner->run(program.string(), arguments, input, result.standardOutput,
                                                      result.standardError);
  return result;
}

const std::string listUploads = "<plist version=\"1.0\"><array><string>list_uploads</string></array></plist>";

} // namespace

TEST(SandboxTool, isStatus12_whenTheOnlyArgumentIsNotPlistin) {
  const SandboxServer server;
  for (const auto& arguments :
       std::vector<std::vector<std::string>>{{}, {"--plist"}, {"--plistin", "x"}, {"listinfo"}}) {
    EXPECT_THAT(run(server.tool(), arguments, listUploads), EndedWith(12, "the only argument must be --plistin"));
  }
}

TEST(SandboxTool, explainsItself_whenAskedForHelp) {
  const SandboxServer server;
  const auto help = run(server.tool("lumexec"), {"--help"});
  EXPECT_THAT(help, Succeeded());
  EXPECT_THAT(help.standardOutput, StartsWith("Usage: lumexec --plistin"));
}

TEST(SandboxTool, isStatus11_whenTheInputIsMalformed) {
  const SandboxServer server;
  EXPECT_THAT(server.requestText(""), EndedWith(11, "lumctl: the request is not a property list"));
  EXPECT_THAT(server.requestText("<plist version=\"1.0\"><dict/></plist>"), EndedWith(11, "not an array"));
  EXPECT_THAT(server.request({"getconfig", true}), EndedWith(11, "element 2 is neither a word nor an array"));
}

TEST(SandboxTool, isStatus12_whenAnElementIsOutOfPlace) {
  const SandboxServer server;
  auto request = asUser(server, {"listworkflows"});
  std::swap(request[1], request[2]);
  EXPECT_THAT(server.request(request), EndedWith(12, "lumctl: the element (\"auth\", ...) is missing"));
}

TEST(SandboxTool, writesNoReply_whenItFails) {
  const SandboxServer server;
  EXPECT_THAT(server.request({"frobnicate"}).standardOutput, IsEmpty());
}

TEST(SandboxTool, findsItsServer_whenTheRootWasMoved) {
  const SandboxServer server;
  const auto moved = server.folder() / "moved";
  std::filesystem::rename(server.root(), moved);
  EXPECT_THAT(run(moved / "usr/bin/lumctl", {"--plistin"}, listUploads), Succeeded());
}

TEST(SandboxTool, findsItsServer_whenReachedThroughALink) {
  const SandboxServer server;
  const auto link = server.folder() / "lumctl";
  std::filesystem::create_symlink(server.tool(), link);
  EXPECT_THAT(run(link, {"--plistin"}, listUploads), Succeeded());
}

TEST(SandboxTool, isStatus20_whenThereIsNoServerBesideIt) {
  const SandboxServer server;
  const auto link = server.folder() / "lumctl";
  std::filesystem::create_symlink(LUMORA_SANDBOX_PROGRAM, link);
  EXPECT_THAT(run(link, {"--plistin"}, listUploads), EndedWith(20, "no server's state"));
}

TEST(SandboxTool, isStatus25_whenTheStateIsDamaged) {
  const SandboxServer server;
  const auto state = server.root() / "var/lib/lumora";
  for (const auto* suffix : {"-wal", "-shm"}) {
    std::filesystem::remove(state / (std::string("server.sqlite") + suffix));
  }
  writeFile(state / "server.sqlite", std::string(8192, 'x'));
  EXPECT_THAT(server.requestText(listUploads), EndedWith(25, "not a database"));
}
