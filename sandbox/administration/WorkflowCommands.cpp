#include "../store/Workflows.h"
#include "Commands.h"

#include <iostream>
#include <memory>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string name;
  std::string title;
  std::vector<std::string> sources;
  bool isFolder = false;
};

WorkflowSource sourceFrom(const std::string& types, bool isFolder) {
  WorkflowSource source{CLI::detail::split(types, ','), isFolder};
  for (const auto& type : source.types) {
    if (!isSourceType(type)) {
      throw std::runtime_error("\"" + type + "\" is not a source type (Video, Screen, Audio, File)");
    }
  }
  return source;
}

void add(const Options& options) {
  Workflow workflow{"", options.name, options.title.empty() ? options.name : options.title, {}, false};
  for (const auto& types : options.sources) {
    workflow.sources.push_back(sourceFrom(types, options.isFolder));
  }
  Store store = Store::open(options.root);
  std::cout << addWorkflow(store, workflow) << '\n';
}

void remove(const Options& options) {
  Store store = Store::open(options.root);
  if (!removeWorkflow(store, options.name)) {
    throw std::runtime_error("there is no workflow " + options.name);
  }
}

std::string textOf(const WorkflowSource& source) {
  return CLI::detail::join(source.types, ",") + (source.isFolder ? " (folder)" : "");
}

void list(const Options& options) {
  Store store = Store::open(options.root);
  for (const auto& workflow : workflows(store)) {
    std::cout << workflow.uuid << '\t' << workflow.name << '\t' << workflow.title << '\t'
              << CLI::detail::join(workflow.sources, textOf, " + ") << '\n';
  }
}

} // namespace

void addWorkflowCommands(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& group = *program.add_subcommand("workflow", "What recordings may be submitted to")->require_subcommand(1);

  auto& adding = *group.add_subcommand("add", "Add a workflow and print its UUID");
  addRootArgument(adding, options->root);
  adding.add_option("NAME", options->name, "name")->required();
  adding.add_option("--title", options->title, "title");
  adding
      .add_option("--source", options->sources, "types that one source takes (Video,Screen,Audio,File); once a source")
      ->required();
  adding.add_flag("--folder", options->isFolder, "the sources take folders of files");
  adding.callback([options] { add(*options); });

  auto& removing = *group.add_subcommand("remove", "Remove a workflow; its episodes stay");
  addRootArgument(removing, options->root);
  removing.add_option("WORKFLOW", options->name, "name or UUID")->required();
  removing.callback([options] { remove(*options); });

  auto& listing = *group.add_subcommand("list", "List the workflows: UUID, name, title, sources");
  addRootArgument(listing, options->root);
  listing.callback([options] { list(*options); });
}

} // namespace lumora::sandbox
