#include "Sandbox.h"

#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/PropertyList.h>

#include <cerrno>
#include <cstdlib>
#include <stdexcept>
#include <system_error>

namespace lumora::tests {

namespace {

std::filesystem::path makeTemporaryFolder() {
  std::string path = (std::filesystem::temp_directory_path() / "lumora-sandbox-XXXXXX").string();
  if (mkdtemp(path.data()) == nullptr) {
    throw std::system_error(errno, std::generic_category(), path);
  }
  return path;
}

void append(std::vector<std::string>& list, const std::vector<std::string>& more) {
  list.insert(list.end(), more.begin(), more.end());
}

Dictionary replyOf(const ProgramRun& run) {
  auto reply = dictionaryWithXMLDescription(run.standardOutput);
  if (run.status != 0 || !reply) {
    throw std::runtime_error("status " + std::to_string(run.status) + ": " + run.standardError);
  }
  return std::move(*reply);
}

} // namespace

SandboxServer::SandboxServer(std::vector<std::string> createArguments)
    : runner_(Platform::current().toolRunner), folder_(makeTemporaryFolder()), root_(folder_ / "server") {
  append(createArguments, {"--user", userName, "--full-name", userFullName});
  const auto created = administrate({"create"}, createArguments, std::string(password) + "\n");
  if (created.status != 0) {
    std::filesystem::remove_all(folder_);
    throw std::runtime_error("no sandbox server could be made: " + created.standardError);
  }
}

SandboxServer::~SandboxServer() {
  std::error_code ignored;
  std::filesystem::remove_all(folder_, ignored);
}

std::filesystem::path SandboxServer::tool(const std::string& name) const {
  return root_ / (name == "lumexec" ? "usr/libexec/lumora" : "usr/bin") / name;
}

ProgramRun SandboxServer::administrate(std::vector<std::string> command, const std::vector<std::string>& arguments,
                                       const std::string& standardInput) const {
  command.push_back(root_.string());
  append(command, arguments);
  return run(LUMORA_SANDBOX_PROGRAM, command, standardInput);
}

void SandboxServer::takeTickets(const std::filesystem::path& keytab, const std::string& principal) const {
  for (const auto& run : {administrate({"single-sign-on", "enable"}, {"--keytab", keytab.string()}),
                          administrate({"single-sign-on", "map"}, {principal, userName})}) {
    if (run.status != 0) {
      throw std::runtime_error("the server takes no tickets: " + run.standardError);
    }
  }
}

ProgramRun SandboxServer::request(const Array& request, const std::string& toolName) const {
  return requestText(xmlDescription(request).value(), toolName);
}

ProgramRun SandboxServer::requestText(const std::string& request, const std::string& toolName) const {
  return run(tool(toolName), {"--plistin"}, request);
}

Array SandboxServer::login() const {
  return {Array{"server", std::string(host) + ":" + std::to_string(port)}, Array{"auth", "Password"},
          Array{"user", userName}, Array{"pass", password}};
}

std::vector<Dictionary> SandboxServer::episodes() const {
  const auto reply = replyOf(administrate({"episodes"}, {"--plist"}));
  std::vector<Dictionary> all;
  for (const auto& episode : *reply.array("episodes")) {
    all.push_back(*episode.dictionary());
  }
  return all;
}

std::string SandboxServer::workflowUUID(const std::string& workflowName) const {
  Array elements = login();
  elements.emplace_back("listworkflows");
  const auto reply = replyOf(request(elements));
  for (const auto& workflow : *reply.array("workflows")) {
    if (workflow.dictionary()->string("name") == workflowName) {
      return workflow.dictionary()->string("uuid").value();
    }
  }
  throw std::runtime_error("there is no workflow " + workflowName);
}

ProgramRun SandboxServer::run(const std::filesystem::path& program, const std::vector<std::string>& arguments,
                              const std::string& standardInput) const {
  ProgramRun result;
  result.status = runner_->run(program.string(), arguments, standardInput, result.standardOutput, result.standardError);
  return result;
}

} // namespace lumora::tests
