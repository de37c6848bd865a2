#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/login/LMRAuthenticationAction.h>
#include <LumoraKit/login/LMRLocalizedString.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>

#include <any>
#include <utility>

namespace {

constexpr std::string_view libraryServerName = "LumoraLibrary";

// What a reply says under a key; nothing when there was none, as for one that could not be decoded.
std::optional<std::string> textInReply(const LMRAction& action, std::string_view key) {
  const auto reply = action.result();
  return reply ? reply->string(key) : std::nullopt;
}

} // namespace

std::shared_ptr<LMRAuthenticationAction>
LMRAuthenticationAction::actionWithServer_port_userName_password(std::optional<std::string> server, std::uint16_t port,
                                                                 std::optional<std::string> userName,
                                                                 std::optional<std::string> password) {
  return std::make_shared<LMRAuthenticationAction>(std::move(server), port, std::move(userName), std::move(password));
}

std::shared_ptr<LMRAuthenticationAction>
LMRAuthenticationAction::actionWithServer_port(std::optional<std::string> server, std::uint16_t port) {
  return std::make_shared<LMRAuthenticationAction>(std::move(server), port);
}

LMRAuthenticationAction::LMRAuthenticationAction(std::optional<std::string> server, std::uint16_t port,
                                                 std::optional<std::string> userName,
                                                 std::optional<std::string> password)
    : LMRAuthenticationAction(std::move(server), port, std::move(userName), std::move(password),
                              LMRAuthenticationTypePassword) {}

LMRAuthenticationAction::LMRAuthenticationAction(std::optional<std::string> server, std::uint16_t port)
    : LMRAuthenticationAction(std::move(server), port, std::nullopt, std::nullopt, LMRAuthenticationTypeSingleSignOn) {}

LMRAuthenticationAction::LMRAuthenticationAction(std::optional<std::string> server, std::uint16_t port,
                                                 std::optional<std::string> userName,
                                                 std::optional<std::string> password,
                                                 LMRAuthenticationType authenticationType) {
  setDescription(LMRLocalizedString("Connecting\\U2026"));
  setSession(LMRSession::session());
  const auto session = this->session();
  session->setServer(std::move(server));
  session->setPort(port == 0 ? LMRDefaultServerPort : port);
  session->setUserName(userName);
  session->setUserFullName(std::move(userName));
  session->setPassword(std::move(password));
  session->setAuthenticationType(authenticationType);
}

LMRAuthenticationAction::~LMRAuthenticationAction() = default;

void LMRAuthenticationAction::setSession(const std::shared_ptr<LMRSession>& session) {
  session_.set(session ? session->copyWithZone() : nullptr);
}

std::shared_ptr<LMRAuthenticationAction> LMRAuthenticationAction::self() {
  return std::static_pointer_cast<LMRAuthenticationAction>(shared_from_this());
}

void LMRAuthenticationAction::startExecution() {
  const auto queue = KTActionQueue::queue();
  queueServerInformation(*queue);
  queueWorkflowList(*queue);
  queue->setErrorTarget_selector(self(), &LMRAuthenticationAction::failedToAuthenticateWithAction);
  queue->setFinishTarget_selector(self(), &LMRAuthenticationAction::authenticatedWithAction);
  startPart(queue);
}

void LMRAuthenticationAction::queueServerInformation(KTActionQueue& queue) {
  const auto session = this->session();
  auto action = LMRActionFactory::actionToGetInfoForServer_port(session ? session->server() : std::nullopt,
                                                                session ? session->port() : LMRDefaultServerPort);
  action->setFinishTarget_selector(self(), &LMRAuthenticationAction::listedInfoWithAction);
  action->setErrorTarget_selector(self(), &LMRAuthenticationAction::failedToListInfoWithAction);
  queue.queueAction(std::move(action));
}

void LMRAuthenticationAction::queueWorkflowList(KTActionQueue& queue) {
  auto action = LMRActionFactory::actionToListWorkflowsWithSession(session());
  action->setFinishTarget_selector(self(), &LMRAuthenticationAction::listedWorkflowsWithAction);
  action->setErrorTarget_selector(self(), &LMRAuthenticationAction::failedToListWorkflowsWithAction);
  queue.queueAction(std::move(action));
}

void LMRAuthenticationAction::stopExecution() {
  if (error()) {
    setSession(nullptr);
  } else if (auto session = this->session()) {
    lumora::Platform::current().notificationCenter->post(LMRAuthenticationActionDidAuthenticateNotification,
                                                         std::any(std::move(session)));
  }
}

// NOLINTNEXTLINE(readability-make-member-function-const): a selector is not const
void LMRAuthenticationAction::listedInfoWithAction(const std::shared_ptr<LMRAction>& action) {
  if (const auto session = this->session()) {
    session->setVersion(textInReply(*action, "server_version"));
  }
}

void LMRAuthenticationAction::failedToListInfoWithAction(const std::shared_ptr<LMRAction>& action) {
  setError(action->error());
}

// NOLINTNEXTLINE(readability-make-member-function-const): a selector is not const
void LMRAuthenticationAction::listedWorkflowsWithAction(const std::shared_ptr<LMRAction>& action) {
  const auto session = this->session();
  if (!session) {
    return;
  }
  if (!session->userName()) {
    session->setUserName(textInReply(*action, LMRWorkflowUserShortNameKey));
  }
  session->setUserFullName(textInReply(*action, "user_fullname"));
  session->setIsLumoraLibraryServer(textInReply(*action, "server") == libraryServerName);
}

void LMRAuthenticationAction::failedToListWorkflowsWithAction(const std::shared_ptr<LMRAction>& action) {
  setError(action->error());
}

void LMRAuthenticationAction::authenticatedWithAction(const std::shared_ptr<KTActionQueue>& /*queue*/) {
  finish();
}

void LMRAuthenticationAction::failedToAuthenticateWithAction(const std::shared_ptr<KTActionQueue>& /*queue*/) {
  setSession(nullptr);
  finish();
}
