// The methods of LMRActionFactory about this machine: its transfers, and its camera as others may use it.
#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRFactoryParts.h>
#include <LumoraKit/login/LMRLocalizedString.h>
#include <LumoraKit/platform/Log.h>

#include <utility>

using lumora::Array;
using lumora::requireForFactory;
using lumora::toolAction;

namespace {

using OptionalText = std::optional<std::string>;

bool hasText(const OptionalText& text) {
  return text && !text->empty();
}

// Nothing for an absent word: lists end at their first absent element.
Array bareWord(const OptionalText& word) {
  return word ? Array{*word} : Array{};
}

std::shared_ptr<LMRPrivilegedAction> privilegedAction(std::string command, Array arguments,
                                                      std::shared_ptr<LMRSession> session,
                                                      lumora::AuthorizationRef authorization,
                                                      std::string_view progressKey) {
  auto action = LMRPrivilegedAction::actionWithCommand_arguments_session(std::move(command), std::move(arguments),
                                                                         std::move(session));
  action->setAuthorizationRef(authorization);
  action->setDescription(LMRLocalizedString(progressKey));
  return action;
}

} // namespace

std::shared_ptr<LMRAction> LMRActionFactory::actionToListCurrentTransfers() {
  return toolAction("list_uploads", std::nullopt, nullptr, "Listing current transfers\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToClearCurrentTransfersList() {
  return toolAction("clear_completed_uploads", std::nullopt, nullptr, "Clearing current transfers\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToGetCameraBindingStatus() {
  return toolAction("isbound", Array{"plist"}, nullptr, "Getting sharing status\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToGetRemoteRecorderConfiguration() {
  return toolAction("getconfig", Array{"plist"}, nullptr, "Getting sharing settings\\U2026");
}

std::shared_ptr<LMRPrivilegedAction> LMRActionFactory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization(
    const OptionalText& value, const OptionalText& key, lumora::AuthorizationRef authorization) {
  requireForFactory(authorization != nullptr, "authorization != nil", __func__);
  requireForFactory(hasText(key), "[key length] > 0", __func__);
  requireForFactory(hasText(value), "[value length] > 0", __func__);
  return privilegedAction("setconfig", Array{lumora::format("%@=%@", {*key, *value})}, nullptr, authorization,
                          "Configuring sharing settings\\U2026");
}

std::shared_ptr<LMRPrivilegedAction> LMRActionFactory::actionToBindCamera_session_authorization(
    const OptionalText& camera, std::shared_ptr<LMRSession> session, lumora::AuthorizationRef authorization) {
  requireForFactory(session != nullptr, "session != nil", __func__);
  requireForFactory(authorization != nullptr, "authorization != nil", __func__);
  return privilegedAction("bind", bareWord(camera), std::move(session), authorization,
                          "Starting camera sharing\\U2026");
}

std::shared_ptr<LMRPrivilegedAction> LMRActionFactory::actionToUnbindCamera_session_authorization(
    const OptionalText& camera, std::shared_ptr<LMRSession> session, lumora::AuthorizationRef authorization) {
  requireForFactory(session != nullptr, "session != nil", __func__);
  requireForFactory(authorization != nullptr, "authorization != nil", __func__);
  return privilegedAction("unbind", bareWord(camera), std::move(session), authorization,
                          "Stopping camera sharing\\U2026");
}
