#include <LumoraKit/LumoraKit.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <iostream>

int main() {
  const lumora::fakes::FakePlatform platform;
  const auto session = LMRSession::session();
  session->setServer("host.example");
  std::cout << session->description() << '\n';
}
