#pragma once

#include <LumoraKit/platform/Observable.h>

#include <any>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>

namespace lumora {

/// The process-wide notices by name. Observers are called on the thread that posts. Any thread.
class LUMORA_EXPORT NotificationCenter {
public:
  /// The object that a notice is about; std::any_cast it to the type that the notice's documentation names.
  using Observer = std::function<void(const std::any& object)>;

  NotificationCenter();
  ~NotificationCenter();

  /// Calls the observer for each notice of that name until the connection ends.
  [[nodiscard]] Connection observe(std::string_view name, Observer observer);
  /// Returns after every observer has been called.
  void post(std::string_view name, const std::any& object);

private:
  std::shared_ptr<detail::Observers> observersOf(std::string_view name);

  std::mutex mutex_;
  std::map<std::string, std::shared_ptr<detail::Observers>, std::less<>> observers_;
};

} // namespace lumora
