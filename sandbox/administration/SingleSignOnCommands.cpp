#include "../TicketProgram.h"
#include "../store/SingleSignOn.h"
#include "Commands.h"

#include <iostream>
#include <memory>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string keytab;
  std::string principal;
  std::string user;
};

void enable(const Options& options) {
  Store store = Store::open(options.root);
  const std::string service = serviceInKeytab(options.keytab);
  enableSingleSignOn(store, options.keytab, service);
  std::cout << "Single sign-on with a ticket for " << service << ".\n";
}

void disable(const Options& options) {
  Store store = Store::open(options.root);
  disableSingleSignOn(store);
}

void map(const Options& options) {
  Store store = Store::open(options.root);
  if (options.principal.find('@') == std::string::npos) {
    throw std::runtime_error("the principal " + options.principal + " has no realm (NAME@REALM)");
  }
  if (!findUser(store, options.user)) {
    throw std::runtime_error("there is no user named " + options.user);
  }
  mapPrincipal(store, options.principal, options.user);
}

void unmap(const Options& options) {
  Store store = Store::open(options.root);
  if (!unmapPrincipal(store, options.principal)) {
    throw std::runtime_error("the principal " + options.principal + " is nobody's");
  }
}

void list(const Options& options) {
  Store store = Store::open(options.root);
  for (const auto& [principal, user] : principals(store)) {
    std::cout << principal << '\t' << user << '\n';
  }
}

} // namespace

void addSingleSignOnCommands(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& group = *program.add_subcommand("single-sign-on", "Logins with Kerberos tickets")->require_subcommand(1);

  auto& enabling = *group.add_subcommand("enable", "Offer single sign-on with a service's key");
  addRootArgument(enabling, options->root);
  enabling.add_option("--keytab", options->keytab, "file with the key of a principal lumora/HOST@REALM; is copied")
      ->required();
  enabling.callback([options] { enable(*options); });

  auto& disabling = *group.add_subcommand("disable", "Offer no single sign-on any more");
  addRootArgument(disabling, options->root);
  disabling.callback([options] { disable(*options); });

  auto& mapping = *group.add_subcommand("map", "Let a principal log in as a user");
  addRootArgument(mapping, options->root);
  mapping.add_option("PRINCIPAL", options->principal, "NAME@REALM")->required();
  mapping.add_option("USER", options->user, "the user's short name")->required();
  mapping.callback([options] { map(*options); });

  auto& unmapping = *group.add_subcommand("unmap", "Let a principal not log in any more");
  addRootArgument(unmapping, options->root);
  unmapping.add_option("PRINCIPAL", options->principal, "NAME@REALM")->required();
  unmapping.callback([options] { unmap(*options); });

  auto& listing = *group.add_subcommand("list", "List the principals: principal, user");
  addRootArgument(listing, options->root);
  listing.callback([options] { list(*options); });
}

} // namespace lumora::sandbox
