#pragma once

#include "support/Sandbox.h"

#include <LumoraKit/actions/LMRSession.h>

#include <cstddef>
#include <memory>
#include <string>

namespace lumora::bench {

/// A server with many remote cameras that starts each 200 ms late, and the framework pointed at it.
class CameraStudio {
public:
  static constexpr std::size_t cameraCount = 64;

  CameraStudio();

  static std::string nameOf(std::size_t index) { return "Camera " + std::to_string(index); }
  const std::shared_ptr<LMRSession>& session() const { return session_; }

private:
  tests::SandboxServer server_;
  std::shared_ptr<LMRSession> session_ = LMRSession::session();
};

} // namespace lumora::bench
