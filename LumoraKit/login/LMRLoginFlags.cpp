#include <LumoraKit/login/LMRLoginFlags.h>

#include <cstdlib>

namespace LMRLoginFlags {

bool isTrue(const lumora::Value* value) {
  return value && value->real().value_or(0) != 0;
}

bool isAutomaticLogin(const KTActionRef& action) {
  const auto userInfo = action ? action->userInfo() : std::nullopt;
  return userInfo && isTrue(userInfo->find(AutomaticLoginKey));
}

std::uint16_t portFromText(const std::string& text) {
  return static_cast<std::uint16_t>(std::strtoll(text.c_str(), nullptr, 10));
}

bool isEmpty(const std::optional<std::string>& text) {
  return !text || text->empty();
}

} // namespace LMRLoginFlags
