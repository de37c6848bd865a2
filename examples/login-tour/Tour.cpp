#include "Tour.h"

#include "../record-episode/Stage.h"

#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <chrono>
#include <iostream>
#include <memory>
#include <optional>

namespace tour {
namespace {

using stage::Failure;

constexpr std::chrono::hours patience{12};

struct Ending {
  void ended(int code) { returnCode = code; }
  std::optional<int> returnCode;
};

std::string wordFor(LMRAuthenticationType type) {
  return type == LMRAuthenticationTypeSingleSignOn ? "by ticket" : "by password";
}

// What the application's preferences keep of the last login.
bool isRemembered(const LMRSession& session) {
  const LMRFrameworkUserDefaults preferences(lumora::Platform::current().application->identifier());
  const auto value = preferences.objectForKey(LMRSavedConnectionKey);
  const lumora::Dictionary* const record = value ? value->dictionary() : nullptr;
  const lumora::Value* const type = record ? record->find(LMRSavedConnectionAuthenticationTypeKey) : nullptr;
  return type && type->integer() == session.authenticationType() &&
         record->string(LMRSavedConnectionServerKey) == session.server() &&
         record->string(LMRSavedConnectionUserNameKey) == session.userName();
}

} // namespace

Tour::Tour(Machine& machine, Robot* robot) : machine_(machine), robot_(robot), label_(new QLabel(&window_)) {
  label_->setAlignment(Qt::AlignHCenter | Qt::AlignBottom);
  label_->setWordWrap(true);
  label_->setMargin(24);
  window_.setCentralWidget(label_);
  window_.setWindowTitle("The login sheet");
  window_.resize(640, 420);
  window_.show();
}

void Tour::run() {
  for (const std::string& gap : machine_.gaps()) {
    std::cout << gap << '\n';
  }
  runByPassword();
  if (machine_.hasRealm()) {
    machine_.getTicket();
    runByTicket();
  }
}

void Tour::runByPassword() {
  const std::string server = machine_.announcesServer()
                                 ? std::string("Choose \"") + Machine::announcedName + "\" from the list of servers"
                                 : std::string("Type the server \"") + Machine::host + "\" and press Return";
  open({"1-password",
        server + ". Log in as \"" + Machine::userName + "\" with the password \"" + Machine::password +
            "\", and have it remembered if you like.",
        LMRAuthenticationTypePassword, &Robot::chooseServerAndTypePassword});
  open({"2-password-again", "The server and the user are remembered, and the password if you wanted it. Press Connect.",
        LMRAuthenticationTypePassword, &Robot::useRememberedPassword});
}

void Tour::runByTicket() {
  open({"3-ticket", "You hold a Kerberos ticket now: the sheet signs on by itself, without a password. Press Connect.",
        LMRAuthenticationTypeSingleSignOn, &Robot::useTicket});
  open({"4-ticket-again", "The login by ticket is remembered. Press Connect.", LMRAuthenticationTypeSingleSignOn,
        &Robot::useTicket});
}

void Tour::open(const Opening& opening) {
  std::cout << '\n' << opening.task << std::endl;
  label_->setText(QString::fromStdString(opening.task));
  const auto ending = std::make_shared<Ending>();
  const auto sheet = std::make_shared<LMRServerLoginSheetController>();
  sheet->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      lumora::qt::windowOf(&window_), std::nullopt, std::nullopt, ending, &Ending::ended, {});
  if (robot_) {
    (robot_->*opening.act)(opening.name, *sheet);
  }
  const auto hasEnded = [&] { return ending->returnCode.has_value(); };
  const auto progress = [] { return std::string("waiting for the login"); };
  robot_ ? stage::waitUntil(hasEnded, progress) : stage::waitUntil(hasEnded, progress, patience);
  if (ending->returnCode != LMRServerLoginSheetController::LoggedIn) {
    throw Failure{"The login was cancelled."};
  }
  tell(*sheet->serverLoginViewController(), opening);
}

void Tour::tell(const LMRServerLoginViewController& panel, const Opening& opening) const {
  const LMRSession& session = *panel.loginSession();
  std::cout << "  Logged in to " << session.description() << " as " << session.userFullName().value_or("(nobody)")
            << ", " << wordFor(session.authenticationType()) << ".\n";
  if (session.authenticationType() != opening.type) {
    throw Failure{"The login should have been one " + wordFor(opening.type) + "."};
  }
  if (!isRemembered(session)) {
    throw Failure{"The connection is not remembered."};
  }
  std::cout << "  Remembered: the server and the user, with a login " << wordFor(opening.type);
  if (opening.type == LMRAuthenticationTypePassword) {
    std::cout << "; " << rememberedPassword(panel, session);
  }
  std::cout << '.' << std::endl;
}

std::string Tour::rememberedPassword(const LMRServerLoginViewController& panel, const LMRSession& session) const {
  const auto stored = LMRKeychainAccess::passwordForUserName_server(session.userName(), session.server());
  if (!machine_.hasKeyring() || !(panel.rememberPasswordInKeychain() || stored)) {
    return "not the password";
  }
  if (stored != session.password()) {
    throw Failure{"The keyring does not hold the password."};
  }
  return "the password, in the keyring";
}

} // namespace tour
