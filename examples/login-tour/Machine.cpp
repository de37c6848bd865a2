#include "Machine.h"

#include "../record-episode/Stage.h"

#include <LumoraKit/LumoraKit.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

namespace tour {

using lumora::tests::ChildProgram;
using lumora::tests::TestAvahi;
using lumora::tests::TestKDC;
using lumora::tests::TestKeyring;
using stage::Failure;

namespace {

constexpr const char* realmPassword = "tickets";

} // namespace

Machine::Machine() {
  lumora::qt::install();
  server_.emplace();
  kerberos_.emplace();
  startKeyring();
  startRealm();
  announceServer();
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server_->root(), platform.toolRunner);
  lumora::Platform::install(platform);
}

bool Machine::allows(const std::string& part, const std::optional<std::string>& obstacle) {
  if (obstacle) {
    gaps_.push_back("Left out here: " + part + ", because " + *obstacle + ".");
  }
  return !obstacle;
}

void Machine::startKeyring() {
  hasKeyring_ = allows("remembering the password", TestKeyring::obstacle());
  if (hasKeyring_ && !keyring_.start()) {
    throw Failure{"The keyring does not start."};
  }
}

void Machine::startRealm() {
  hasRealm_ = allows("the login by ticket", TestKDC::obstacle());
  if (!hasRealm_) {
    return;
  }
  if (!kerberos_->start()) {
    throw Failure{"The Kerberos server does not start."};
  }
  kerberos_->addUser(userName, realmPassword);
  server_->takeTickets(kerberos_->addService(std::string("lumora/") + host),
                       userName + std::string("@") + TestKDC::realm);
}

void Machine::announceServer() {
  if (!allows("finding the server", TestAvahi::obstacle())) {
    return;
  }
  if (!network_.start()) {
    throw Failure{"The Avahi daemon does not start."};
  }
  announcement_ = ChildProgram::start(
      {LUMORA_SANDBOX_PROGRAM, "announce", server_->root().string(), "--name", announcedName, "--host", host});
  if (!announcement_ || announcement_->readLine().empty()) {
    throw Failure{"The server cannot be announced."};
  }
}

void Machine::getTicket() {
  if (!kerberos_->logIn(userName, realmPassword)) {
    throw Failure{"The Kerberos server gives no ticket."};
  }
}

} // namespace tour
