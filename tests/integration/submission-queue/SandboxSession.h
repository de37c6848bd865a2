#pragma once

#include "support/Sandbox.h"

#include <LumoraKit/actions/LMRSession.h>

#include <memory>

/// The sandbox's user.
inline std::shared_ptr<LMRSession> sandboxSession() {
  using Server = lumora::tests::SandboxServer;
  auto session = LMRSession::session();
  session->setServer(Server::host);
  session->setPort(Server::port);
  session->setUserName(Server::userName);
  session->setPassword(Server::password);
  session->setAuthenticationType(LMRAuthenticationTypePassword);
  return session;
}
