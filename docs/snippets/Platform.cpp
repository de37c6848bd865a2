// The examples about the platform's interfaces.

#include <LumoraKit/LumoraKit.h>

#include <iostream>
#include <memory>
#include <string>
#include <string_view>

namespace snippets {

class TerminalLog final : public lumora::Log {
public:
  void write(std::string_view line) override { std::clog << std::string(line) + "\n"; }
};

void anotherLog() {
  auto platform = lumora::Platform::current();
  platform.log = std::make_shared<TerminalLog>();
  lumora::Platform::install(platform);
}

void sandbox(const std::string& root) {
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(root, platform.toolRunner);
  lumora::Platform::install(platform);
}

void sandboxInAFolder() {
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>("/tmp/server", platform.toolRunner);
  lumora::Platform::install(platform);
}

// RootedToolRunner.h
void testServer() {
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>("/srv/test-server", platform.toolRunner);
  lumora::Platform::install(platform);
}

} // namespace snippets
