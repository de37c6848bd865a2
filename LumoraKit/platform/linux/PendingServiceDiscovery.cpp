#include <LumoraKit/platform/ServiceDiscovery.h>
#include <LumoraKit/platform/linux/Backends.h>

namespace lumora::backend {
namespace {

class AbsentServiceDiscovery final : public ServiceDiscovery {
public:
  std::unique_ptr<ServiceBrowser> browse(std::string_view /*type*/, ServiceBrowserEvents /*events*/,
                                         LMRErrorRef* error) override {
    if (error) {
      *error = LMRError::make("org.vantor.lumora.discovery", -1, "This build has no service discovery");
    }
    return nullptr;
  }
};

} // namespace

std::shared_ptr<ServiceDiscovery> makeServiceDiscovery() {
  return std::make_shared<AbsentServiceDiscovery>();
}

} // namespace lumora::backend
