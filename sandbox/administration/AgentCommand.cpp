#include "../store/Store.h"
#include "Commands.h"

#include <cerrno>
#include <memory>
#include <stdexcept>
#include <system_error>

#include <unistd.h>

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
  const auto program = std::filesystem::read_symlink("/proc/self/exe").replace_filename("lumora-sandbox-agent");
  execl(program.c_str(), program.c_str(), options.root.c_str(), "--authority", options.authority.c_str(), nullptr);
  throw std::system_error(errno, std::generic_category(), program.string());
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
