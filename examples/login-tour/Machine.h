#pragma once

#include "support/ChildProgram.h"
#include "support/Sandbox.h"
#include "support/TestAvahi.h"
#include "support/TestKDC.h"
#include "support/TestKeyring.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace tour {

/// All that a login can meet on a user's machine, of this program's own, and gone with the object: a network on which a
/// sandbox server announces itself, a keyring, a Kerberos realm, and empty preferences. Nothing of the user's is read
/// or written. To be made once, after the QApplication, which has the
/// user's display, and before anything of the framework is used.
class Machine {
public:
  static constexpr const char* announcedName = "Demo studio";
  static constexpr const char* host = lumora::tests::SandboxServer::host;
  static constexpr const char* userName = lumora::tests::SandboxServer::userName;
  /// On the server.
  static constexpr const char* password = lumora::tests::SandboxServer::password;

  /// Starts what this machine allows, and installs the platform. What does not come up is a stage::Failure.
  Machine();

  /// What cannot be shown here, and why: sentences.
  const std::vector<std::string>& gaps() const { return gaps_; }
  bool announcesServer() const { return announcement_ != nullptr; }
  bool hasKeyring() const { return hasKeyring_; }
  bool hasRealm() const { return hasRealm_; }

  /// The user logs in to the realm, as at the beginning of a day.
  void getTicket();

private:
  /// Whether there is no obstacle to this part of the demo; else it is a gap.
  bool allows(const std::string& part, const std::optional<std::string>& obstacle);
  void startKeyring();
  void startRealm();
  void announceServer();

  std::vector<std::string> gaps_;
  bool hasKeyring_ = false;
  bool hasRealm_ = false;
  // With folders of its own, which the framework looks up when it is first used.
  lumora::tests::TestKeyring keyring_;
  lumora::tests::TestAvahi network_;
  std::optional<lumora::tests::SandboxServer> server_;
  std::optional<lumora::tests::TestKDC> kerberos_;
  std::unique_ptr<lumora::tests::ChildProgram> announcement_;
};

} // namespace tour
