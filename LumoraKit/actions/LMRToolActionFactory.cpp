#include <LumoraKit/actions/LMRRequest.h>
#include <LumoraKit/actions/LMRToolActionFactory.h>
#include <LumoraKit/login/LMRLocalizedString.h>

#include <utility>

using lumora::requestPair;

std::shared_ptr<LMRToolAction>
LMRToolActionFactory::actionToSubmitWorkflow_withMasterPassword_metadataPath_andInputs_withSession(
    const std::optional<std::string>& workflow, const std::optional<std::string>& masterPassword,
    const std::optional<std::string>& metadataPath, const std::vector<std::string>& inputs,
    std::shared_ptr<LMRSession> session) {
  lumora::Array arguments{requestPair("workflow", workflow), requestPair("metadata", metadataPath),
                          requestPair("basedir", "/tmp")};
  if (masterPassword) {
    arguments.push_back(requestPair("master_password", *masterPassword));
  }
  for (const auto& input : inputs) {
    arguments.push_back(requestPair("input", input));
  }
  auto action =
      LMRToolAction::actionWithCommand_arguments_session("workflow", std::move(arguments), std::move(session));
  action->setDescription(LMRLocalizedString("Submitting workflow\\U2026"));
  return action;
}
