#include <LumoraKit/platform/KTHelperAgent.h>
#include <LumoraKit/platform/Platform.h>

namespace lumora {

HelperAgent::~HelperAgent() = default;

} // namespace lumora

std::optional<lumora::Dictionary> KTHelperAgentPerformCommand(const std::string& agent, std::string_view domain,
                                                              lumora::AuthorizationRef authorization,
                                                              const std::string& command,
                                                              const lumora::Dictionary& request, LMRErrorRef* error) {
  return lumora::Platform::current().helperAgent->performCommand(agent, domain, authorization, command, request, error);
}
