#include <LumoraKit/platform/KTHost.h>

#include <utility>

KTHost::KTHost(std::string name, bool isCurrentHost) : name_(std::move(name)), isCurrentHost_(isCurrentHost) {}

KTHost KTHost::hostWithName(std::string name) {
  return {std::move(name), false};
}
