#include <LumoraKit/testing/FakeKerberos.h>

#include <utility>

namespace lumora::fakes {

FakeKerberos::FakeKerberos() = default;
FakeKerberos::~FakeKerberos() = default;

void FakeKerberos::setDefaultRealm(std::string name) {
  const std::lock_guard lock(mutex_);
  name_ = std::move(name);
  status_ = 0;
}

void FakeKerberos::fail(std::int32_t status) {
  const std::lock_guard lock(mutex_);
  name_.clear();
  status_ = status;
}

std::size_t FakeKerberos::lookUpCount() const {
  const std::lock_guard lock(mutex_);
  return lookUpCount_;
}

std::int32_t FakeKerberos::defaultRealm(std::string& name) {
  const std::lock_guard lock(mutex_);
  ++lookUpCount_;
  name = name_;
  return status_;
}

} // namespace lumora::fakes
