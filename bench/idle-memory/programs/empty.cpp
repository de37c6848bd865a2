// A C++ program that does nothing.

#include "Idle.h"

int main() {
  return idle();
}
