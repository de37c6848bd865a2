#include "../MachineName.h"
#include "../store/Store.h"
#include "Commands.h"

#include <memory>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string name;
  std::string host;
};

// A program of its own: the bus library takes longer to load than all that a tool does.
void announce(const Options& options) {
  const std::string port = Store::open(options.root).setting("port", "8170");
  const std::string name = options.name.empty() ? "Sandbox on " + machineName() : options.name;
  const std::string host = options.host.empty() ? machineName() : options.host;
  becomeProgram("lumora-sandbox-announce", {"--", name, port, "host=" + host, "port=" + port});
}

} // namespace

void addAnnounceCommand(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& command = *program.add_subcommand(
      "announce", "Announce the server to the network, so that login panels list it, until it is ended");
  addRootArgument(command, options->root);
  command.add_option("--name", options->name, "what users see; without it \"Sandbox on\" and the machine's name");
  command.add_option("--host", options->host, "the host that is told; without it the machine's name");
  command.callback([options] { announce(*options); });
}

} // namespace lumora::sandbox
