#pragma once

#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/Value.h>

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace lumora::tests {

/// How a program ended.
struct ProgramRun {
  int status = 0;
  std::string standardOutput;
  std::string standardError;
};

/// A server of its own for one test, in a temporary folder that goes away with it. It has one user, answers at
/// localhost:8170, and has the workflows that a new server has ("single-video", "audio-podcast", ...).
///
///     SandboxServer server;
///     auto platform = lumora::Platform::current();
///     platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server.root(), platform.toolRunner);
///     lumora::Platform::install(platform);
///
/// Make it before a runner with a root is installed: it runs its own programs with the platform's runner of that
/// moment. A server that cannot be made fails the test and stops it there (an exception).
class SandboxServer {
public:
  static constexpr const char* host = "localhost";
  static constexpr std::uint16_t port = 8170;
  static constexpr const char* userName = "ada";
  static constexpr const char* userFullName = "Ada Lovelace";
  static constexpr const char* password = "correct horse";

  /// Further arguments for `lumora-sandbox create` ("--library-server").
  explicit SandboxServer(std::vector<std::string> createArguments = {});
  SandboxServer(const SandboxServer&) = delete;
  SandboxServer& operator=(const SandboxServer&) = delete;
  ~SandboxServer();

  const std::filesystem::path& root() const { return root_; }
  /// A folder for the test's own files; goes away with the server.
  const std::filesystem::path& folder() const { return folder_; }
  std::filesystem::path tool(const std::string& name = "lumctl") const;

  /// Runs `lumora-sandbox` with a command of one or two words, this server's root, and further arguments:
  /// administrate({"user", "remove"}, {"ada"}).
  ProgramRun administrate(std::vector<std::string> command, const std::vector<std::string>& arguments = {},
                          const std::string& standardInput = {}) const;
  /// The server takes Kerberos tickets as well from now on, and lets the principal in as its user.
  void takeTickets(const std::filesystem::path& keytab, const std::string& principal) const;
  /// Runs a tool with the request's property list on its standard input.
  ProgramRun request(const Array& request, const std::string& toolName = "lumctl") const;
  ProgramRun requestText(const std::string& request, const std::string& toolName = "lumctl") const;
  /// The elements that begin a request of this server's user.
  Array login() const;

  /// What was submitted, as `lumora-sandbox episodes --plist` tells it.
  std::vector<Dictionary> episodes() const;
  std::string workflowUUID(const std::string& workflowName) const;

private:
  ProgramRun run(const std::filesystem::path& program, const std::vector<std::string>& arguments,
                 const std::string& standardInput) const;

  std::shared_ptr<ToolRunner> runner_;
  std::filesystem::path folder_;
  std::filesystem::path root_;
};

} // namespace lumora::tests
