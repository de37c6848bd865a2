#include "../Status.h"
#include "../cameras/Preview.h"
#include "../store/Configuration.h"
#include "Command.h"

namespace lumora::sandbox {

namespace {

[[noreturn]] void refuse(const std::string& reason) {
  throw Refusal(Status::SharingFailed, reason);
}

std::string quoted(const std::string& text) {
  return '"' + text + '"';
}

void bind(Context& context, const std::string& name) {
  if (name.empty()) {
    throw Refusal(Status::InvalidArguments, "the camera's name is empty");
  }
  if (const auto bound = boundCamera(context.store)) {
    refuse("this machine's camera is shared as " + quoted(bound->name) + " already");
  }
  if (findCamera(context.store, name)) {
    refuse("the server has a camera named " + quoted(name) + " already");
  }
  addCamera(context.store, name, true);
  configure(context.store, cameraNameKey, name);
  configure(context.store, serverHostKey, context.host);
}

void unbind(Context& context, const std::string& name) {
  const auto camera = boundCamera(context.store);
  if (!camera || camera->name != name) {
    refuse("this machine's camera is not shared as " + quoted(name));
  }
  if (camera->take) {
    throw Refusal(Status::RemoteCameraFailure, "the remote camera " + quoted(name) + " is recording");
  }
  removeCamera(context.store, name);
}

void checkFree(Store& store, const std::string& key) {
  if ((key == cameraNameKey || key == serverHostKey) && boundCamera(store)) {
    refuse(key + " cannot be changed while the camera is shared");
  }
}

Dictionary bindingStatus(Store& store) {
  const auto camera = boundCamera(store);
  Dictionary status{{"Bound", camera.has_value()}};
  if (camera) {
    status.set(cameraNameKey, camera->name);
  }
  return status;
}

} // namespace

Dictionary isBound(Context& context, const Arguments&) {
  return bindingStatus(context.store);
}

Dictionary getConfiguration(Context& context, const Arguments&) {
  Dictionary reply;
  for (const auto& [key, value] : configuration(context.store)) {
    reply.set(key, value);
  }
  return reply;
}

Dictionary setConfiguration(Context& context, const Arguments& arguments) {
  const std::string& text = arguments.text("key and value");
  const auto equals = text.find('=');
  const std::string key = text.substr(0, equals);
  if (equals == std::string::npos || !isConfigurationKey(key)) {
    throw Refusal(Status::InvalidArguments, quoted(text) + " does not begin with a configuration key and \"=\"");
  }
  context.store.change([&] {
    checkFree(context.store, key);
    configure(context.store, key, text.substr(equals + 1));
  });
  return getConfiguration(context, arguments);
}

Dictionary bindCamera(Context& context, const Arguments& arguments) {
  const std::string& name = arguments.text("camera");
  context.store.change([&] { bind(context, name); });
  updatePreview(context.store, boundCamera(context.store).value());
  return bindingStatus(context.store);
}

Dictionary unbindCamera(Context& context, const Arguments& arguments) {
  context.store.change([&] { unbind(context, arguments.text("camera")); });
  return bindingStatus(context.store);
}

} // namespace lumora::sandbox
