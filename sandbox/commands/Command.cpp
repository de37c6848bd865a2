#include "Command.h"

#include "../MachineName.h"
#include "../Status.h"

#include <algorithm>

namespace lumora::sandbox {

namespace {

using Form = Argument::Form;
using Count = Argument::Count;
using Login = Command::Login;

Argument text(std::string_view key, Count count = Count::One) {
  return {Form::Text, key, count};
}

Argument either(std::string_view key, std::string_view otherKey, Count count = Count::One) {
  return {Form::Text, key, count, otherKey};
}

Argument flag(std::string_view key) {
  return {Form::Flag, key, Count::Optional};
}

Argument word(std::string_view key, Count count = Count::Optional) {
  return {Form::Word, key, count};
}

Command verb(std::string_view name, Grammar rest, decltype(Command::run) run) {
  rest.insert(rest.begin(), text(name));
  return {name, Login::Required, std::move(rest), run, true};
}

/// For the superuser, with one word.
Command privileged(std::string_view name, Login login, std::string_view object, decltype(Command::run) run) {
  return {name, login, {{Form::AnyWord, object}}, run, false, true};
}

const std::vector<Command>& mainCommands() {
  static const std::vector<Command> commands{
      {"listinfo", Login::None, {text("server")}, listInfo},
      {"listworkflows", Login::Required, {}, listWorkflows},
      {"infoworkflow", Login::Required, {text("workflow_uuid")}, infoWorkflow},
      {"installworkflow",
       Login::Required,
       {text("path"), text("master_password", Count::Optional), word("overwrite")},
       installWorkflow},
      {"downloadworkflow", Login::Required, {text("workflow_uuid"), text("path")}, downloadWorkflow},
      {"deleteworkflow", Login::Required, {text("workflow_uuid")}, deleteWorkflow},
      {"create_recording", Login::Required, {text("workflow_uuid")}, createRecordingContainer},
      {"submit",
       Login::Required,
       {flag("async"), flag("delete"), text("file", Count::Many), text("metadata"),
        text("recording_metadata", Count::Optional), either("workflow", "submission_uuid")},
       submit},
      {"list_uploads", Login::None, {}, listUploads},
      {"clear_completed_uploads", Login::None, {}, clearCompletedUploads},
      {"listcameras", Login::Required, {}, listCameras},
      verb("status", {word("update_preview_image"), word("include_preview_image")}, cameraStatus),
      verb("start", {{Form::Number, "delay"}, word("audio_only")}, startCamera),
      verb("pause", {}, pauseCamera),
      verb("resume", {}, resumeCamera),
      verb("cancel", {}, cancelCamera),
      verb("stop", {text("metadata"), either("workflow", "submission_uuid")}, stopCamera),
      {"isbound", Login::None, {word("plist", Count::One)}, isBound},
      {"getconfig", Login::None, {word("plist", Count::One)}, getConfiguration},
      privileged("setconfig", Login::None, "key and value", setConfiguration),
      privileged("bind", Login::Required, "camera", bindCamera),
      privileged("unbind", Login::Required, "camera", unbindCamera),
  };
  return commands;
}

const std::vector<Command>& actionCommands() {
  static const std::vector<Command> commands{
      {"workflow",
       Login::Required,
       {text("workflow"), text("metadata"), text("basedir"), text("master_password", Count::Optional),
        text("input", Count::Many)},
       submitWorkflow},
  };
  return commands;
}

bool isOwnName(const std::string& host) {
  return host == "localhost" || host == "127.0.0.1" || host == "sandbox.local" || host == machineName();
}

} // namespace

std::span<const Command> commandsOf(ToolKind tool) {
  return tool == ToolKind::Action ? actionCommands() : mainCommands();
}

const Command& findCommand(ToolKind tool, const Call& call) {
  const auto commands = commandsOf(tool);
  const auto found = std::find_if(commands.begin(), commands.end(), [&](const Command& command) {
    return command.word == call.command && command.isVerb == call.isVerb;
  });
  if (found == commands.end()) {
    throw Refusal(Status::InvalidArguments, "\"" + call.command + "\" is not a command");
  }
  return *found;
}

void checkAddress(Store& store, const Address& address) {
  constexpr std::uint16_t defaultPort = 8170;
  if (!isOwnName(address.host)) {
    throw Refusal(Status::NoServerAtHostname, "there is no server at \"" + address.host + "\"");
  }
  const std::string port = std::to_string(address.port == 0 ? defaultPort : address.port);
  if (port != store.setting("port", std::to_string(defaultPort))) {
    throw Refusal(Status::ServerUnavailable, "no server listens on port " + port + " of " + address.host);
  }
}

} // namespace lumora::sandbox
