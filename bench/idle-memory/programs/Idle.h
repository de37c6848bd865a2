#pragma once

#include <iostream>

#include <unistd.h>

/// What an idle program does: says that it is ready, and waits for the end of its standard input.
inline int idle() {
  std::cout << "ready" << std::endl; // NOLINT(performance-avoid-endl): the other side waits for it
  char byte = 0;
  while (read(STDIN_FILENO, &byte, 1) > 0) {
  }
  return 0;
}
