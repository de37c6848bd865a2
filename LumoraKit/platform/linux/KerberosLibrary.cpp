#include <LumoraKit/platform/Kerberos.h>
#include <LumoraKit/platform/linux/Backends.h>

#include <memory>

#include <krb5.h>

namespace lumora::backend {
namespace {

// A context of its own for each call: one must not be shared by threads, and the machine's configuration may have
// changed.
class KerberosLibrary final : public Kerberos {
public:
  std::int32_t defaultRealm(std::string& name) override;
};

struct ContextRelease {
  void operator()(krb5_context context) const { krb5_free_context(context); }
};
using Context = std::unique_ptr<std::remove_pointer_t<krb5_context>, ContextRelease>;

std::int32_t KerberosLibrary::defaultRealm(std::string& name) {
  name.clear();
  krb5_context made = nullptr;
  // Fails where the configuration cannot be read.
  krb5_error_code status = krb5_init_context(&made);
  const Context context(made);
  if (status != 0) {
    return status;
  }
  char* realm = nullptr;
  status = krb5_get_default_realm(context.get(), &realm);
  if (status == 0 && realm != nullptr) {
    name = realm;
  }
  krb5_free_default_realm(context.get(), realm);
  return status;
}

} // namespace

std::shared_ptr<Kerberos> makeKerberos() {
  return std::make_shared<KerberosLibrary>();
}

} // namespace lumora::backend
