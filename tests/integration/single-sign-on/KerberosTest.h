#pragma once

#include "support/Sandbox.h"
#include "support/TestKDC.h"

#include <gtest/gtest.h>

namespace lumora::tests {

/// A server with single sign-on, its user "ada" being the principal of that name, and a Kerberos server.
class KerberosTest : public testing::Test {
protected:
  static constexpr const char* service = "lumora/localhost";

  void SetUp() override {
    if (const auto obstacle = TestKDC::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(kerberos_.start());
    for (const char* const name : {"ada", "bob"}) {
      kerberos_.addUser(name, "tickets");
    }
    keytab_ = kerberos_.addService(service);
    server_.takeTickets(keytab_, principal("ada"));
  }

  static std::string principal(const std::string& name) { return name + "@" + TestKDC::realm; }
  bool logIn(const std::string& user, const std::vector<std::string>& arguments = {}) {
    return kerberos_.logIn(user, "tickets", arguments);
  }

  SandboxServer server_;
  TestKDC kerberos_;
  std::filesystem::path keytab_;
};

} // namespace lumora::tests
