#include "Agent.h"
#include "PrivilegedTool.h"

#include <sodium.h>

#include <cstdlib>
#include <filesystem>
#include <iostream>

#include <CLI/CLI.hpp>

namespace {

using namespace lumora::sandbox;

std::unique_ptr<Authority> authorityNamed(const std::string& name) {
  return name == "owner" ? ownerAuthority() : polkitAuthority();
}

int serve(const std::filesystem::path& root, const std::string& authority) {
  const PrivilegedTool tool(root);
  Agent agent(authorityNamed(authority),
              [&tool](const AgentCall& call, GDBusMethodInvocation& invocation) { tool.perform(call, invocation); });
  const std::string reason = agent.run();
  std::cerr << "lumora-sandbox-agent: " << reason << '\n';
  return EXIT_FAILURE;
}

} // namespace

int main(int argc, char** argv) {
  CLI::App program("The helper agent of a sandbox server: changes its configuration for who may do that.",
                   "lumora-sandbox-agent");
  std::string root;
  std::string authority = "polkit";
  program.add_option("ROOT", root, "the server's root folder")->required()->check(CLI::ExistingDirectory);
  program.add_option("--authority", authority, "who decides: polkit, or owner (root and who runs the agent may)")
      ->check(CLI::IsMember({"polkit", "owner"}))
      ->capture_default_str();
  CLI11_PARSE(program, argc, argv);
  if (sodium_init() < 0) {
    std::cerr << "lumora-sandbox-agent: there are no random bytes\n";
    return EXIT_FAILURE;
  }
  return serve(std::filesystem::absolute(root), authority);
}
