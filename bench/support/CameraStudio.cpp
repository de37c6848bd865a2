#include "support/CameraStudio.h"

#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/RootedToolRunner.h>

namespace lumora::bench {

CameraStudio::CameraStudio() {
  for (std::size_t index = 0; index < cameraCount; ++index) {
    server_.administrate({"camera", "add"}, {nameOf(index)});
  }
  server_.administrate({"inject", "latency"}, {"--command", "start", "--milliseconds", "200"});
  auto platform = Platform::current();
  platform.toolRunner = std::make_shared<RootedToolRunner>(server_.root(), platform.toolRunner);
  Platform::install(platform);
  session_->setServer(tests::SandboxServer::host);
  session_->setPort(tests::SandboxServer::port);
  session_->setUserName(tests::SandboxServer::userName);
  session_->setPassword(tests::SandboxServer::password);
  session_->setAuthenticationType(LMRAuthenticationTypePassword);
}

} // namespace lumora::bench
