#include "recorder/model/ServerCatalogue.h"

namespace recorder {
namespace {

std::vector<lumora::Dictionary> entries(const LMRAction& action, std::string_view key) {
  std::vector<lumora::Dictionary> found;
  const auto reply = action.result();
  const lumora::Array* const list = reply ? reply->array(key) : nullptr;
  for (const lumora::Value& entry : list ? *list : lumora::Array()) {
    if (const lumora::Dictionary* const dictionary = entry.dictionary()) {
      found.push_back(*dictionary);
    }
  }
  return found;
}

} // namespace

void ServerCatalogue::load(const std::shared_ptr<LMRSession>& session) {
  isLoading_ = true;
  const auto workflows = LMRActionFactory::actionToListWorkflowsWithSession(session);
  workflows->setFinishTarget_selector(shared_from_this(), &ServerCatalogue::workflowsCame);
  workflows->setErrorTarget_selector(shared_from_this(), &ServerCatalogue::workflowsFailed);
  workflows->start();
  const auto cameras = LMRActionFactory::actionToListRemoteCamerasWithSession(session);
  cameras->setFinishTarget_selector(shared_from_this(), &ServerCatalogue::camerasCame);
  cameras->start();
}

void ServerCatalogue::workflowsCame(const std::shared_ptr<LMRAction>& action) {
  workflows_.clear();
  for (const lumora::Dictionary& description : entries(*action, LMRWorkflowsKey)) {
    if (auto workflow = Workflow::withDescription(description)) {
      workflows_.push_back(std::move(*workflow));
    }
  }
  isLoading_ = false;
  error_ = nullptr;
  changed.notify();
}

void ServerCatalogue::workflowsFailed(const std::shared_ptr<LMRAction>& action) {
  isLoading_ = false;
  error_ = action->error();
  changed.notify();
}

// A server without cameras of its own may also refuse the question.
void ServerCatalogue::camerasCame(const std::shared_ptr<LMRAction>& action) {
  cameras_.clear();
  for (const lumora::Dictionary& description : entries(*action, LMRCamerasKey)) {
    if (const auto name = description.string(LMRCameraNameKey)) {
      cameras_.push_back({SourceKind::RemoteCamera, *name, *name});
    }
  }
  changed.notify();
}

} // namespace recorder
