#pragma once

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <string>

namespace lumora::bench {

/// A discovery daemon on a bus that tells of as many services as the bench wants, each at five places, like a machine
/// with a cable, a radio and its own loop. Main thread only, whose loop must run.
class CrowdedNetwork {
public:
  /// \param address of the bus, which must be up
  explicit CrowdedNetwork(const std::string& address);
  CrowdedNetwork(const CrowdedNetwork&) = delete;
  CrowdedNetwork& operator=(const CrowdedNetwork&) = delete;
  ~CrowdedNetwork();

  /// How many searches have been begun so far.
  int searches() const { return searches_; }

  /// So many services come, or go, for the search begun last.
  void come(int count) { tellOf("ItemNew", count); }
  void go(int count) { tellOf("ItemRemove", count); }

private:
  static void called(GDBusConnection* bus, const gchar* sender, const gchar* path, const gchar* interface,
                     const gchar* method, GVariant* parameters, GDBusMethodInvocation* invocation, gpointer self);

  void serve(const char* path);
  void tellOf(const char* signal, int count) const;

  const backend::GLibPtr<GDBusConnection> bus_;
  const guint name_;
  int searches_ = 0;
};

} // namespace lumora::bench
