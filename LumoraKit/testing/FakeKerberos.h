#pragma once

#include <LumoraKit/platform/Kerberos.h>

#include <cstddef>
#include <mutex>
#include <string>

namespace lumora::fakes {

/// A machine in no realm, until the test puts it into one. Any thread.
class LUMORA_EXPORT FakeKerberos final : public Kerberos {
public:
  FakeKerberos();
  ~FakeKerberos() override;

  /// The look-up succeeds with this name, which may be empty.
  void setDefaultRealm(std::string name);
  /// The look-up fails with this status.
  void fail(std::int32_t status);
  /// How often the realm was looked up.
  std::size_t lookUpCount() const;

  std::int32_t defaultRealm(std::string& name) override;

private:
  mutable std::mutex mutex_;
  std::string name_;
  std::int32_t status_ = KerberosNotAvailable;
  std::size_t lookUpCount_ = 0;
};

} // namespace lumora::fakes
