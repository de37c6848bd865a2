#include "../store/MasterPassword.h"
#include "Commands.h"

#include <memory>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string passwordFile;
};

void set(const Options& options) {
  Store store = Store::open(options.root);
  setMasterPassword(store, readPassword(options.passwordFile));
}

} // namespace

void addMasterPasswordCommand(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& command = *program.add_subcommand("master-password", "Set the password that protected workflows need");
  addRootArgument(command, options->root);
  addPasswordOption(command, options->passwordFile);
  command.callback([options] { set(*options); });
}

} // namespace lumora::sandbox
