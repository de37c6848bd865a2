#include "../cameras/Preview.h"
#include "Commands.h"

#include <iostream>
#include <memory>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

struct Options {
  std::string root;
  std::string name;
};

void add(const Options& options) {
  Store store = Store::open(options.root);
  if (options.name.empty()) {
    throw std::runtime_error("the camera's name is empty");
  }
  store.change([&] {
    addCamera(store, options.name, false);
    updatePreview(store, findCamera(store, options.name).value());
  });
}

void remove(const Options& options) {
  Store store = Store::open(options.root);
  if (!removeCamera(store, options.name)) {
    throw std::runtime_error("there is no camera named " + options.name);
  }
}

void list(const Options& options) {
  Store store = Store::open(options.root);
  for (const auto& camera : cameras(store)) {
    std::cout << camera.name << '\t' << nameOf(stateAt(camera, currentMilliseconds())) << '\t'
              << (camera.take ? camera.take->user : "") << '\n';
  }
}

} // namespace

void addCameraCommands(CLI::App& program) {
  auto options = std::make_shared<Options>();
  auto& group = *program.add_subcommand("camera", "Remote cameras that the server offers")->require_subcommand(1);

  auto& adding = *group.add_subcommand("add", "Add a camera");
  addRootArgument(adding, options->root);
  adding.add_option("NAME", options->name, "name")->required();
  adding.callback([options] { add(*options); });

  auto& removing = *group.add_subcommand("remove", "Remove a camera, whatever it is doing; its recording is lost");
  addRootArgument(removing, options->root);
  removing.add_option("NAME", options->name, "name")->required();
  removing.callback([options] { remove(*options); });

  auto& listing = *group.add_subcommand("list", "List the cameras: name, state, for whom it records");
  addRootArgument(listing, options->root);
  listing.callback([options] { list(*options); });
}

} // namespace lumora::sandbox
