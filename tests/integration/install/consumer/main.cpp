#include <LumoraKit/LumoraKit.h>

#include <iostream>

int main() {
  const auto session = LMRSession::session();
  session->setServer("host.example");
  std::cout << session->description() << '\n';
}
