#pragma once

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <functional>

namespace lumora::backend {

/// Which signal, of whom. What is null may be anything.
struct DBusSignal {
  const char* sender = nullptr;
  const char* interface = nullptr;
  const char* name = nullptr;
  const char* object = nullptr;
  const char* firstArgument = nullptr;
};

/// A handler for one signal, for as long as it lives. It is called on the thread that made it, by the default context
/// of that thread, and must not end the subscription.
class DBusSubscription {
public:
  using Handler = std::function<void(GVariant& arguments)>;

  DBusSubscription(GDBusConnection* connection, const DBusSignal& signal, Handler handler);
  DBusSubscription(const DBusSubscription&) = delete;
  DBusSubscription& operator=(const DBusSubscription&) = delete;
  ~DBusSubscription();

private:
  const GLibPtr<GDBusConnection> connection_;
  Handler handler_;
  const guint id_;
};

} // namespace lumora::backend
