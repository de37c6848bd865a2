// The methods of LMRActionFactory about remote cameras. Their verbs travel as the first argument, without a command.
#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRFactoryParts.h>
#include <LumoraKit/actions/LMRRequest.h>

#include <utility>

using lumora::Array;
using lumora::requestPair;
using lumora::toolAction;

namespace {

using OptionalText = std::optional<std::string>;

} // namespace

std::shared_ptr<LMRAction> LMRActionFactory::actionToListRemoteCamerasWithSession(std::shared_ptr<LMRSession> session) {
  return toolAction("listcameras", std::nullopt, std::move(session), "Getting remote cameras\\U2026");
}

std::shared_ptr<LMRAction>
LMRActionFactory::actionToGetStatusForRemoteCamera_session(const OptionalText& camera,
                                                           std::shared_ptr<LMRSession> session) {
  return toolAction(std::nullopt, Array{requestPair("status", camera)}, std::move(session),
                    "Getting remote camera status\\U2026");
}

std::shared_ptr<LMRAction>
LMRActionFactory::actionToUpdatePreviewImageForRemoteCamera_session(const OptionalText& camera,
                                                                    std::shared_ptr<LMRSession> session) {
  return toolAction(std::nullopt, Array{requestPair("status", camera), "update_preview_image", "include_preview_image"},
                    std::move(session), "Getting remote camera preview\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToStartRemoteCamera_afterDelay_audioOnly_session(
    const OptionalText& camera, std::uint64_t delay, bool audioOnly, std::shared_ptr<LMRSession> session) {
  Array arguments{requestPair("start", camera), requestPair("delay", delay)};
  if (audioOnly) {
    arguments.emplace_back("audio_only");
  }
  return toolAction(std::nullopt, std::move(arguments), std::move(session), "Starting remote camera recording\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToPauseRemoteCamera_session(const OptionalText& camera,
                                                                               std::shared_ptr<LMRSession> session) {
  return toolAction(std::nullopt, Array{requestPair("pause", camera)}, std::move(session),
                    "Pausing remote camera recording\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToResumeRemoteCamera_session(const OptionalText& camera,
                                                                                std::shared_ptr<LMRSession> session) {
  return toolAction(std::nullopt, Array{requestPair("resume", camera)}, std::move(session),
                    "Resuming remote camera recording\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToCancelRemoteCamera_session(const OptionalText& camera,
                                                                                std::shared_ptr<LMRSession> session) {
  return toolAction(std::nullopt, Array{requestPair("cancel", camera)}, std::move(session),
                    "Cancelling remote camera recording\\U2026");
}
