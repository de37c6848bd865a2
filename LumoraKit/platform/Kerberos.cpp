#include <LumoraKit/platform/Kerberos.h>

namespace lumora {

Kerberos::~Kerberos() = default;

} // namespace lumora
