#include <LumoraKit/platform/Kerberos.h>
#include <LumoraKit/platform/linux/Backends.h>

namespace lumora::backend {
namespace {

class AbsentKerberos final : public Kerberos {
public:
  std::int32_t defaultRealm(std::string& name) override {
    name.clear();
    return KerberosNotAvailable;
  }
};

} // namespace

std::shared_ptr<Kerberos> makeKerberos() {
  return std::make_shared<AbsentKerberos>();
}

} // namespace lumora::backend
