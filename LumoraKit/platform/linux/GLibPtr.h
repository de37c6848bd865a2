#pragma once

#include <gio/gio.h>

#include <concepts>
#include <memory>

namespace lumora::backend {

/// Gives back one reference to an object of GLib or GIO, or frees what has none.
struct GLibRelease {
  template <class T> void operator()(T* object) const {
    if constexpr (std::same_as<T, gchar>) {
      g_free(object);
    } else if constexpr (std::same_as<T, GError>) {
      g_error_free(object);
    } else if constexpr (std::same_as<T, GVariant>) {
      g_variant_unref(object);
    } else if constexpr (std::same_as<T, GMainContext>) {
      g_main_context_unref(object);
    } else if constexpr (std::same_as<T, GMainLoop>) {
      g_main_loop_unref(object);
    } else if constexpr (std::same_as<T, GSource>) {
      g_source_destroy(object);
      g_source_unref(object);
    } else {
      g_object_unref(object);
    }
  }
};

/// The owner of one reference; of a source also its end.
template <class T> using GLibPtr = std::unique_ptr<T, GLibRelease>;

} // namespace lumora::backend
