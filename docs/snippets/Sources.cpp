// The examples about sources.

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <string>
#include <vector>

namespace snippets {

struct Menu {
  void add(const std::string& title, const std::string& identifier);
};

std::vector<std::string> offersFor(const lumora::Dictionary& workflow) {
  std::vector<std::string> offers;
  if (LMRWorkflowAdditions::acceptsVideo(workflow)) {
    offers.emplace_back("Camera");
  }
  if (LMRWorkflowAdditions::acceptsScreen(workflow)) {
    offers.emplace_back("Screen");
  }
  if (LMRWorkflowAdditions::acceptsAudio(workflow)) {
    offers.emplace_back("Microphone");
  }
  if (LMRWorkflowAdditions::acceptsDual(workflow)) {
    offers.emplace_back("Two sources at once");
  }
  return offers; // none: the workflow takes files only
}

void listCameras(Menu* menu) {
  for (const auto& camera : LMRCaptureDeviceAdditions::videoCaptureDevices()) {
    menu->add(camera->localizedDisplayName(), camera->uniqueID());
  }
}

void listRemoteCameras(const std::shared_ptr<LMRSession>& session, Menu* menu) {
  auto list = LMRActionFactory::actionToListRemoteCamerasWithSession(session);
  list->runSynchronously();
  const auto reply = list->result();
  const lumora::Array* const cameras = reply ? reply->array(LMRCamerasKey) : nullptr;
  for (const lumora::Value& camera : cameras ? *cameras : lumora::Array()) {
    if (camera.dictionary()) {
      menu->add(camera.dictionary()->string(LMRCameraNameKey).value_or(""), "");
    }
  }
}

} // namespace snippets
