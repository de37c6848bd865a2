// The methods of LMRActionFactory about a server and its workflows.
#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRFactoryParts.h>
#include <LumoraKit/actions/LMRRequest.h>

#include <utility>

using lumora::Array;
using lumora::requestPair;
using lumora::toolAction;

std::shared_ptr<LMRAction> LMRActionFactory::actionToGetInfoForServer_port(const std::optional<std::string>& server,
                                                                           std::uint16_t port) {
  const auto address = lumora::hostAndPort(server, port == 0 ? LMRDefaultServerPort : port);
  return toolAction("listinfo", Array{requestPair("server", address)}, nullptr, "Connecting\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToListWorkflowsWithSession(std::shared_ptr<LMRSession> session) {
  return toolAction("listworkflows", std::nullopt, std::move(session), "Getting workflows\\U2026");
}

std::shared_ptr<LMRAction>
LMRActionFactory::actionToGetWorkflowInformationWithUUID_withSession(const std::optional<std::string>& uuid,
                                                                     std::shared_ptr<LMRSession> session) {
  return toolAction("infoworkflow", Array{requestPair("workflow_uuid", uuid)}, std::move(session),
                    "Getting workflow information\\U2026");
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToInstallWorkflowFromPath_withMasterPassword_overwrite_withSession(
    const std::optional<std::string>& path, const std::optional<std::string>& masterPassword, bool overwrite,
    std::shared_ptr<LMRSession> session) {
  Array arguments{requestPair("path", path)};
  if (masterPassword) {
    arguments.push_back(requestPair("master_password", *masterPassword));
  }
  if (overwrite) {
    arguments.emplace_back("overwrite");
  }
  return toolAction("installworkflow", std::move(arguments), std::move(session), "Installing workflow\\U2026");
}

std::shared_ptr<LMRAction>
LMRActionFactory::actionToDownloadWorkflowWithUUID_toPath_withSession(const std::optional<std::string>& uuid,
                                                                      const std::optional<std::string>& path,
                                                                      std::shared_ptr<LMRSession> session) {
  return toolAction("downloadworkflow", Array{requestPair("workflow_uuid", uuid), requestPair("path", path)},
                    std::move(session), "Downloading workflow\\U2026");
}

std::shared_ptr<LMRAction>
LMRActionFactory::actionToDeleteWorkflowWithUUID_withSession(const std::optional<std::string>& uuid,
                                                             std::shared_ptr<LMRSession> session) {
  return toolAction("deleteworkflow", Array{requestPair("workflow_uuid", uuid)}, std::move(session),
                    "Deleting workflow\\U2026");
}

std::shared_ptr<LMRAction>
LMRActionFactory::actionToCreateRecordingContainerForWorkflowUUID_session(const std::optional<std::string>& uuid,
                                                                          std::shared_ptr<LMRSession> session) {
  return toolAction("create_recording", Array{requestPair("workflow_uuid", uuid)}, std::move(session),
                    "Creating recording container\\U2026");
}
