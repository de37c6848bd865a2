#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/Log.h>

#include <utility>

std::shared_ptr<LMRSession> LMRSession::session() {
  return std::make_shared<LMRSession>();
}

LMRSession::LMRSession() = default;
LMRSession::~LMRSession() = default;

std::shared_ptr<LMRSession> LMRSession::newSession() const {
  return std::make_shared<LMRSession>();
}

std::shared_ptr<LMRSession> LMRSession::copyWithZone(std::nullptr_t /*zone*/) const {
  auto copy = newSession();
  copy->setServer(server());
  copy->setVersion(version());
  copy->setPort(port());
  copy->setUserName(userName());
  copy->setUserFullName(userFullName());
  copy->password_.set(password_.get());
  copy->setAuthenticationType(authenticationType());
  copy->setRequiresValidCertificate(requiresValidCertificate());
  return copy;
}

std::optional<std::string> LMRSession::password() const {
  const auto password = password_.get();
  return password ? std::optional(password->text()) : std::nullopt;
}

void LMRSession::setPassword(std::optional<std::string> password) {
  password_.set(password ? std::optional<lumora::Secret>(std::move(*password)) : std::nullopt);
}

std::string LMRSession::description() const {
  return lumora::format("%@:%d", {lumora::text(server()), lumora::text(unsigned{port()})});
}
