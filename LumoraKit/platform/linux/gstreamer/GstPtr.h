#pragma once

#include <gst/gst.h>

#include <concepts>
#include <memory>

namespace lumora::backend {

/// Gives back one reference, or frees what has none.
struct GstRelease {
  template <class T> void operator()(T* object) const {
    if constexpr (std::same_as<T, gchar>) {
      g_free(object);
    } else if constexpr (std::same_as<T, GError>) {
      g_error_free(object);
    } else if constexpr (std::same_as<T, GstStructure>) {
      gst_structure_free(object);
    } else if constexpr (isMiniObject<T>) {
      gst_mini_object_unref(GST_MINI_OBJECT_CAST(object));
    } else {
      gst_object_unref(object);
    }
  }

private:
  template <class T>
  static constexpr bool isMiniObject = std::same_as<T, GstBuffer> || std::same_as<T, GstSample> ||
                                       std::same_as<T, GstCaps> || std::same_as<T, GstMessage>;
};

/// The owner of one reference to a GStreamer object, or of a GLib string or error.
template <class T> using GstPtr = std::unique_ptr<T, GstRelease>;

/// A further reference to a GStreamer object.
template <class T> GstPtr<T> retain(T* object) {
  return GstPtr<T>(static_cast<T*>(gst_object_ref(object)));
}

/// Hands the result of a C function to a GstPtr through its out-parameter: `GstOut(error)` is a T**.
template <class T> class GstOut {
public:
  explicit GstOut(GstPtr<T>& owner) : owner_(owner) {}
  GstOut(const GstOut&) = delete;
  GstOut& operator=(const GstOut&) = delete;
  ~GstOut() { owner_.reset(object_); }
  operator T**() { return &object_; }

private:
  GstPtr<T>& owner_;
  T* object_ = nullptr;
};

} // namespace lumora::backend
