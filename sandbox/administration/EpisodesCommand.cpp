#include "../submission/Staging.h"
#include "Commands.h"
#include "EpisodeReport.h"

#include <LumoraKit/platform/PropertyList.h>

#include <iostream>
#include <memory>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  bool isPropertyList = false;
};

void list(const Options& options) {
  Store store = Store::open(options.root);
  clearAway(store);
  const auto all = episodes(store);
  std::cout << (options.isPropertyList ? xmlDescription(describe(store, all)).value() : report(store, all));
}

} // namespace

void addEpisodesCommand(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& command = *program.add_subcommand("episodes", "Tell what was submitted, with metadata, files and checksums");
  addRootArgument(command, options->root);
  command.add_flag("--plist", options->isPropertyList, "as an XML property list");
  command.callback([options] { list(*options); });
}

} // namespace lumora::sandbox
