#include <LumoraKit/actions/LMRFactoryParts.h>
#include <LumoraKit/login/LMRLocalizedString.h>
#include <LumoraKit/platform/Assert.h>

#include <utility>

namespace lumora {

void requireForFactory(bool holds, std::string_view condition, std::string_view operation) {
  assertThat(holds, condition, operation, "LMRActionFactory");
}

std::shared_ptr<LMRAction> toolAction(std::optional<std::string> command, std::optional<Array> arguments,
                                      std::shared_ptr<LMRSession> session, std::string_view progressKey) {
  auto action =
      LMRAction::actionWithCommand_arguments_session(std::move(command), std::move(arguments), std::move(session));
  action->setDescription(LMRLocalizedString(progressKey));
  return action;
}

} // namespace lumora
