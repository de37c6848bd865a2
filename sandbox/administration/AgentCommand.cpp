#include "../store/Store.h"
#include "Commands.h"

#include <memory>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string authority = "polkit";
};

// A program of its own: the bus library takes longer to load than all that a tool does.
void serve(const Options& options) {
  if (!Store::existsAt(options.root)) {
    throw std::runtime_error("there is no server at " + options.root);
  }
  becomeProgram("lumora-sandbox-agent", {options.root, "--authority", options.authority});
}

} // namespace

void addAgentCommand(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& command = *program.add_subcommand("agent", "Serve as the machine's helper agent, until it is ended");
  addRootArgument(command, options->root);
  command
      .add_option("--authority", options->authority, "who decides: polkit, or owner (root and who runs the agent may)")
      ->check(CLI::IsMember({"polkit", "owner"}))
      ->capture_default_str();
  command.callback([options] { serve(*options); });
}

} // namespace lumora::sandbox
