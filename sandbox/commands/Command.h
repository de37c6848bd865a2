#pragma once

#include "../protocol/Call.h"
#include "../protocol/Grammar.h"
#include "../store/Store.h"
#include "../store/Users.h"
#include "../store/Workflows.h"

#include <LumoraKit/platform/Value.h>

#include <span>

namespace lumora::sandbox {

/// What a command works with.
struct Context {
  Store& store;
  /// Who asks; set exactly for the commands that need a login.
  std::optional<User> user;
  /// The server as the login named it; empty without a login.
  std::string host;
  /// For standard error, although the command succeeded.
  std::vector<std::string> remarks;
};

/// One command of the tools.
struct Command {
  enum class Login { None, Required };

  std::string_view word;
  Login login;
  Grammar grammar;
  /// Does the work and gives the reply; throws a Refusal.
  Dictionary (*run)(Context& context, const Arguments& arguments);
  /// Named by a verb with its object in place of a command word.
  bool isVerb = false;
  /// For the superuser.
  bool isPrivileged = false;
};

/// The commands of a tool. To add one, write its function and add its line to the table.
std::span<const Command> commandsOf(ToolKind tool);
/// Refuses an unknown command as invalid arguments.
const Command& findCommand(ToolKind tool, const Call& call);

/// The workflow with the UUID; refuses an unknown one as invalid arguments.
Workflow workflowWithUUID(Store& store, const std::string& uuid);

/// Refuses a server that is not this one: another host, or a port where nothing listens.
void checkAddress(Store& store, const Address& address);

Dictionary listInfo(Context& context, const Arguments& arguments);
Dictionary listWorkflows(Context& context, const Arguments& arguments);
Dictionary infoWorkflow(Context& context, const Arguments& arguments);
Dictionary installWorkflow(Context& context, const Arguments& arguments);
Dictionary downloadWorkflow(Context& context, const Arguments& arguments);
Dictionary deleteWorkflow(Context& context, const Arguments& arguments);
Dictionary createRecordingContainer(Context& context, const Arguments& arguments);
Dictionary submit(Context& context, const Arguments& arguments);
Dictionary submitWorkflow(Context& context, const Arguments& arguments);
Dictionary listUploads(Context& context, const Arguments& arguments);
Dictionary clearCompletedUploads(Context& context, const Arguments& arguments);
Dictionary listCameras(Context& context, const Arguments& arguments);
Dictionary cameraStatus(Context& context, const Arguments& arguments);
Dictionary startCamera(Context& context, const Arguments& arguments);
Dictionary pauseCamera(Context& context, const Arguments& arguments);
Dictionary resumeCamera(Context& context, const Arguments& arguments);
Dictionary cancelCamera(Context& context, const Arguments& arguments);
Dictionary stopCamera(Context& context, const Arguments& arguments);
Dictionary isBound(Context& context, const Arguments& arguments);
Dictionary getConfiguration(Context& context, const Arguments& arguments);
Dictionary setConfiguration(Context& context, const Arguments& arguments);
Dictionary bindCamera(Context& context, const Arguments& arguments);
Dictionary unbindCamera(Context& context, const Arguments& arguments);

} // namespace lumora::sandbox
