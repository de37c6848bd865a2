#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRRequest.h>
#include <LumoraKit/login/LMRLocalizedString.h>

#include <utility>

std::shared_ptr<LMRAction> LMRActionFactory::actionToGetInfoForServer_port(const std::optional<std::string>& server,
                                                                           std::uint16_t port) {
  const auto address = lumora::hostAndPort(server, port == 0 ? LMRDefaultServerPort : port);
  auto action =
      LMRAction::actionWithCommand_arguments("listinfo", lumora::Array{lumora::requestPair("server", address)});
  action->setDescription(LMRLocalizedString("Connecting\\U2026"));
  return action;
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToListWorkflowsWithSession(std::shared_ptr<LMRSession> session) {
  auto action = LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, std::move(session));
  action->setDescription(LMRLocalizedString("Getting workflows\\U2026"));
  return action;
}
