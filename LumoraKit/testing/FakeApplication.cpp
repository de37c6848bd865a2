#include <LumoraKit/testing/FakeApplication.h>

namespace lumora::fakes {

FakeApplication::FakeApplication() = default;
FakeApplication::~FakeApplication() = default;

} // namespace lumora::fakes
