#include "Loops.h"

#include "support/MainLoop.h"

#include <glib.h>

namespace {

struct Serving {
  const std::function<bool()>& condition;
  GMainLoop* loop;
  int turnsLeft;

  static gboolean look(gpointer serving) {
    auto& self = *static_cast<Serving*>(serving);
    if (self.condition() || --self.turnsLeft == 0) {
      g_main_loop_quit(self.loop);
    }
    return G_SOURCE_CONTINUE;
  }
};

bool serveWithGLib(const std::function<bool()>& condition) {
  constexpr guint interval = 2;
  Serving serving{condition, g_main_loop_new(nullptr, FALSE),
                  static_cast<int>(std::chrono::milliseconds(lumora::tests::generousLimit).count() / interval)};
  const guint ticker = g_timeout_add(interval, &Serving::look, &serving);
  g_main_loop_run(serving.loop);
  g_source_remove(ticker);
  g_main_loop_unref(serving.loop);
  return serving.turnsLeft > 0;
}

} // namespace

Loop plainLoop() {
  return {"PlainLoop", lumora::tests::serveUntil};
}

Loop glibLoop() {
  return {"GLibLoop", serveWithGLib};
}
