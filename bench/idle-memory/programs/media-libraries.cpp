// What every program that records with GStreamer has loaded.

#include "Idle.h"

#include <gio/gio.h>
#include <gst/gst.h>

int main() {
  gst_init(nullptr, nullptr);
  return idle();
}
