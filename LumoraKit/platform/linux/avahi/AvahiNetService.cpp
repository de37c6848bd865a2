#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/linux/avahi/AvahiNetService.h>

#include <utility>

namespace lumora::backend {

AvahiNetService::AvahiNetService(std::shared_ptr<AvahiLink> link, ServiceInstance instance)
    : link_(std::move(link)), instance_(std::move(instance)) {}

AvahiNetService::~AvahiNetService() {
  stopResolution();
}

void AvahiNetService::stopResolution() {
  if (resolution_) {
    link_->post([resolution = std::move(resolution_)](AvahiDaemon&) { resolution->stop(); });
  }
}

// Its end is told apart from that of an earlier one, which may be on its way already.
void AvahiNetService::resolveWithTimeout(std::chrono::milliseconds limit) {
  stopResolution();
  const unsigned number = ++number_;
  auto report = [weak = weak_from_this(), number](const LMRErrorRef& error, std::optional<TextRecord> record) {
    Platform::current().mainThread->post([weak, number, error, record = std::move(record)] {
      if (const auto self = weak.lock(); self && self->number_ == number) {
        self->ended(error, record);
      }
    });
  };
  resolution_ = std::make_shared<ServiceResolution>(instance_, limit, std::move(report));
  link_->post([resolution = resolution_](AvahiDaemon& daemon) { resolution->start(daemon); });
}

void AvahiNetService::ended(const LMRErrorRef& error, const std::optional<TextRecord>& record) {
  resolution_.reset();
  if (!error) {
    record_ = record;
  }
  const auto delegate = delegate_.lock();
  if (delegate && error) {
    delegate->netService_didNotResolve(shared_from_this(), error);
  } else if (delegate) {
    delegate->netServiceDidResolveAddress(shared_from_this());
  }
}

} // namespace lumora::backend
