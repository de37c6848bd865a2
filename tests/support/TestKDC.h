#pragma once

#include "ChildProgram.h"
#include "TemporaryFolder.h"

#include <LumoraKit/platform/KTRunTask.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace lumora::tests {

/// A Kerberos server (MIT krb5kdc) of one test's own, on a free port of this machine, with the caller's side of it:
/// while it exists, this process and its children have its configuration and an empty credential cache in their
/// environment. Needs no rights. Make one before a runner with a root is installed; a second one takes the first one's
/// place in the environment. What cannot be set up fails the test and stops it there (an exception).
///
///     TestKDC kerberos;
///     ASSERT_TRUE(kerberos.start());
///     kerberos.addUser("ada", "apple");
///     ASSERT_TRUE(kerberos.logIn("ada", "apple"));
class TestKDC {
public:
  static constexpr const char* realm = "LUMORA.TEST";

  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();

  explicit TestKDC(std::string ownRealm = realm);
  TestKDC(const TestKDC&) = delete;
  TestKDC& operator=(const TestKDC&) = delete;
  ~TestKDC();

  /// True when it has come up.
  bool start();
  /// Ends it; the caller's tickets stay.
  void stop();

  void addUser(const std::string& name, const std::string& password);
  /// Adds a service with a random key ("lumora/localhost"), and gives a keytab with the key.
  std::filesystem::path addService(const std::string& name);

  /// Gets a ticket from the server (kinit); true when there is one.
  /// \param arguments further ones, for example a lifetime: {"-l", "2s"}
  bool logIn(const std::string& user, const std::string& password, const std::vector<std::string>& arguments = {});
  void logOut();

  /// Has all callers ask at another port of this machine.
  void pointClientsAt(std::uint16_t port);
  /// All callers are on a machine that is in no realm from now on.
  void forgetRealm();

private:
  int run(const std::string& program, const std::vector<std::string>& arguments, const std::string& input = {});
  void administrate(const std::string& query);
  void require(const std::string& program, const std::vector<std::string>& arguments);
  bool startAt(std::uint16_t port);

  const std::string realm_;
  const std::shared_ptr<ToolRunner> runner_;
  TemporaryFolder folder_;
  std::unique_ptr<ChildProgram> server_;
};

} // namespace lumora::tests
