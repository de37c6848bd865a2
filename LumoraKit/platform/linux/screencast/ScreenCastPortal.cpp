#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>
#include <LumoraKit/platform/linux/screencast/ScreenCastPortal.h>

namespace lumora::backend {

ScreenCastPortal::ScreenCastPortal(std::shared_ptr<Queues> queues, std::chrono::milliseconds stepLimit)
    : queues_(std::move(queues)), stepLimit_(stepLimit) {}

LMRErrorRef ScreenCastPortal::check() {
  auto outcome = startOnWorker(*queues_, [self = shared_from_this()] { return self->learn(); });
  return outcome.wait_for(checkDeadline) == std::future_status::ready ? outcome.get() : portalTimedOut();
}

LMRErrorRef ScreenCastPortal::learn() {
  LMRErrorRef error;
  const auto link = this->link(error);
  if (!link) {
    return error;
  }
  const GLibPtr<GMainContext> context(g_main_context_new());
  const GLibPtr<GCancellable> cancellable(g_cancellable_new());
  return PortalConversation({link, context.get(), cancellable.get(), checkDeadline}).learnFeatures();
}

std::shared_ptr<ScreenCast> ScreenCastPortal::open() {
  const auto screen = std::make_shared<ScreenCast>(shared_from_this());
  startOnWorker(*queues_, [screen] { screen->run(); });
  // The worker keeps the screen for as long as it talks; what is handed out ends that.
  return {screen.get(), [screen](ScreenCast*) { screen->close(); }};
}

std::shared_ptr<DBusLink> ScreenCastPortal::link(LMRErrorRef& error) {
  if (auto open = sharedLink(nullptr)) {
    return open;
  }
  GError* noAddress = nullptr;
  const GLibPtr<gchar> address(g_dbus_address_get_for_bus_sync(G_BUS_TYPE_SESSION, nullptr, &noAddress));
  GLibPtr<GError> reason(noAddress);
  auto connected = address ? DBusOperation(stepLimit_).connect(address.get(), reason) : nullptr;
  if (!connected) {
    error = screenError(CaptureErrorCode::ScreenUnavailable,
                        format("The screen cannot be captured without a session bus: %@", {reason->message}));
    return nullptr;
  }
  return sharedLink(std::move(connected));
}

// Of several first calls the quickest one's connection is used by all.
std::shared_ptr<DBusLink> ScreenCastPortal::sharedLink(std::shared_ptr<DBusLink> replacement) {
  const std::lock_guard lock(mutex_);
  if (!link_ || !link_->isOpen()) {
    link_.swap(replacement);
  }
  return link_;
}

std::string ScreenCastPortal::takeRestoreToken() {
  const std::lock_guard lock(mutex_);
  return std::exchange(restoreToken_, {});
}

void ScreenCastPortal::keepRestoreToken(const std::string& token) {
  const std::lock_guard lock(mutex_);
  restoreToken_ = token;
}

} // namespace lumora::backend
