#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/ObserverList.h>

#include <utility>

namespace lumora {

NotificationCenter::NotificationCenter() = default;

NotificationCenter::~NotificationCenter() = default;

Connection NotificationCenter::observe(std::string_view name, Observer observer) {
  return observersOf(name)->add(std::move(observer));
}

void NotificationCenter::post(std::string_view name, const std::any& object) {
  observersOf(name)->tell(object);
}

std::shared_ptr<detail::Observers> NotificationCenter::observersOf(std::string_view name) {
  const std::lock_guard lock(mutex_);
  auto found = observers_.find(name);
  if (found == observers_.end()) {
    found = observers_.emplace(name, std::make_shared<detail::Observers>()).first;
  }
  return found->second;
}

} // namespace lumora
