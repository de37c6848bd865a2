#include <LumoraKit/platform/linux/avahi/AvahiLink.h>

#include <utility>

namespace lumora::backend {

std::shared_ptr<AvahiLink> AvahiLink::open() {
  auto thread = GLibThread::start();
  return thread ? std::make_shared<AvahiLink>(std::move(thread)) : nullptr;
}

AvahiLink::AvahiLink(std::unique_ptr<GLibThread> thread)
    : thread_(std::move(thread)), daemon_(std::make_shared<AvahiDaemon>()) {
  post([](AvahiDaemon& daemon) { daemon.start(); });
}

AvahiLink::~AvahiLink() {
  post([](AvahiDaemon& daemon) { daemon.end(); });
}

void AvahiLink::post(Work work) {
  thread_->post([daemon = daemon_, work = std::move(work)] { work(*daemon); });
}

} // namespace lumora::backend
