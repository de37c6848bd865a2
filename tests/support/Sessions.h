#pragma once

#include <LumoraKit/actions/LMRSession.h>

#include <memory>

namespace lumora::tests {

/// Alice at lumora.example.org, on the default port.
inline std::shared_ptr<LMRSession> passwordSession() {
  auto session = LMRSession::session();
  session->setServer("lumora.example.org");
  session->setUserName("alice");
  session->setPassword("open sesame");
  session->setAuthenticationType(LMRAuthenticationTypePassword);
  return session;
}

inline std::shared_ptr<LMRSession> kerberosSession() {
  auto session = passwordSession();
  session->setAuthenticationType(LMRAuthenticationTypeSingleSignOn);
  return session;
}

} // namespace lumora::tests
