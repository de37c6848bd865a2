#include "../store/Users.h"
#include "Commands.h"

#include <iostream>
#include <memory>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string name;
  std::string fullName;
  std::string passwordFile;
};

void add(const Options& options) {
  Store store = Store::open(options.root);
  addUser(store, {options.name, options.fullName.empty() ? options.name : options.fullName},
          readPassword(options.passwordFile));
}

void remove(const Options& options) {
  Store store = Store::open(options.root);
  if (!removeUser(store, options.name)) {
    throw std::runtime_error("there is no user named " + options.name);
  }
}

void list(const Options& options) {
  Store store = Store::open(options.root);
  for (const auto& user : users(store)) {
    std::cout << user.name << '\t' << user.fullName << '\n';
  }
}

} // namespace

void addUserCommands(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& group = *program.add_subcommand("user", "Who may log in")->require_subcommand(1);

  auto& adding = *group.add_subcommand("add", "Add a user, or change one's password and full name");
  addRootArgument(adding, options->root);
  adding.add_option("NAME", options->name, "short name")->required();
  adding.add_option("--full-name", options->fullName, "full name");
  addPasswordOption(adding, options->passwordFile);
  adding.callback([options] { add(*options); });

  auto& removing = *group.add_subcommand("remove", "Remove a user");
  addRootArgument(removing, options->root);
  removing.add_option("NAME", options->name, "short name")->required();
  removing.callback([options] { remove(*options); });

  auto& listing = *group.add_subcommand("list", "List the users: short name, full name");
  addRootArgument(listing, options->root);
  listing.callback([options] { list(*options); });
}

} // namespace lumora::sandbox
