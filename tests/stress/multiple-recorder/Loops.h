#pragma once

#include <functional>
#include <ostream>
#include <string>

/// A loop of an application's that serves the main thread until the condition holds; false when that took too long.
struct Loop {
  std::string name;
  std::function<bool(const std::function<bool()>& condition)> serveUntil;
};

inline void PrintTo(const Loop& loop, std::ostream* stream) {
  *stream << loop.name;
}

/// The framework's own, for a program that has none.
Loop plainLoop();
Loop glibLoop();
/// Of QCoreApplication, which on this platform iterates GLib's default context.
Loop qtLoop();
/// Of QCoreApplication told not to, with the lumora::MainThread of lumorakit-qt, installed meanwhile.
Loop qtLoopWithoutGLib();
