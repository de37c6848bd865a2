#include "../Invocation.h"
#include "../store/Users.h"
#include "../store/Workflows.h"
#include "Commands.h"

#include <filesystem>
#include <iostream>
#include <memory>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string user;
  std::string fullName;
  std::string passwordFile;
  std::uint16_t port = 8170;
  bool isLibraryServer = false;
  std::string version = "2.0.1";
};

void addFirstUser(Store& store, const Options& options, const std::string& password) {
  addUser(store, {options.user, options.fullName.empty() ? options.user : options.fullName}, password);
}

void set(Store& store, const Options& options) {
  store.setSetting("port", std::to_string(options.port));
  store.setSetting("server_kind", options.isLibraryServer ? "LumoraLibrary" : "LumoraServer");
  store.setSetting("server_version", options.version);
}

void create(const Options& options) {
  // Before anything is made, so that a missing password leaves nothing behind.
  const std::string password = options.user.empty() ? "" : readPassword(options.passwordFile);
  // First, because tools without a state do no harm, but a state without tools would pass for a server.
  installTools(options.root, std::filesystem::read_symlink("/proc/self/exe"));
  Store store = Store::create(options.root);
  store.change([&] {
    set(store, options);
    addDefaultWorkflows(store);
    if (!options.user.empty()) {
      addFirstUser(store, options, password);
    }
  });
  std::cout << "Created a server at " << store.root().string() << ", port " << options.port << ".\n";
}

} // namespace

void addCreateCommand(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& command = *program.add_subcommand("create", "Make a server with one workflow of each kind");
  addRootArgument(command, options->root);
  auto* user = command.add_option("--user", options->user, "short name of a first user");
  command.add_option("--full-name", options->fullName, "the user's full name")->needs(user);
  addPasswordOption(command, options->passwordFile);
  command.add_option("--port", options->port, "port that the server answers at")->capture_default_str();
  command.add_flag("--library-server", options->isLibraryServer, "be a library server");
  command.add_option("--server-version", options->version, "version that the server tells")->capture_default_str();
  command.callback([options] { create(*options); });
}

} // namespace lumora::sandbox
