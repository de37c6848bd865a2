#include <LumoraKit/actions/LMRToolAction.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>

#include <utility>

std::shared_ptr<LMRToolAction> LMRToolAction::actionWithCommand_arguments_session(
    std::optional<std::string> command, std::optional<lumora::Array> arguments, std::shared_ptr<LMRSession> session) {
  return std::make_shared<LMRToolAction>(std::move(command), std::move(arguments), std::move(session));
}

std::shared_ptr<LMRToolAction>
LMRToolAction::actionWithCommand_arguments(const std::optional<std::string>& /*command*/,
                                           const std::optional<lumora::Array>& /*arguments*/) {
  lumora::log("WARNING: %@ tried to create a LMRToolAction without a server session",
              {lumora::Platform::current().application->identifier()});
  return nullptr;
}

LMRToolAction::LMRToolAction(std::optional<std::string> command, std::optional<lumora::Array> arguments,
                             std::shared_ptr<LMRSession> session)
    : LMRAction(std::move(command), std::move(arguments), std::move(session)) {
  setTool(std::string(LMRLumoraActionToolPath));
}

LMRToolAction::~LMRToolAction() = default;
