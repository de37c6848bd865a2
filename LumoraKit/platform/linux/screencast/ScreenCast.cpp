#include <LumoraKit/platform/linux/screencast/ScreenCast.h>
#include <LumoraKit/platform/linux/screencast/ScreenCastPortal.h>

namespace lumora::backend {
ScreenCast::ScreenCast(std::shared_ptr<ScreenCastPortal> portal)
    : portal_(std::move(portal)), context_(g_main_context_new()), cancellable_(g_cancellable_new()) {}

void ScreenCast::run() {
  end(talk());
}

LMRErrorRef ScreenCast::talk() {
  LMRErrorRef error;
  const auto link = portal_->link(error);
  if (!link) {
    return error;
  }
  PortalConversation conversation({link, context_.get(), cancellable_.get(), portal_->stepLimit()});
  error = open(conversation);
  return error ? error : conversation.awaitEnd();
}

LMRErrorRef ScreenCast::open(PortalConversation& conversation) {
  if (LMRErrorRef error = conversation.prepare(portal_->takeRestoreToken())) {
    return error;
  }
  enter(Stage::Asking);
  if (LMRErrorRef error = conversation.ask()) {
    return error;
  }
  portal_->keepRestoreToken(conversation.restoreToken());
  if (LMRErrorRef error = conversation.openRemote()) {
    return error;
  }
  {
    const std::lock_guard lock(mutex_);
    node_ = conversation.node();
    remote_ = conversation.takeRemote();
  }
  enter(Stage::Shown);
  return nullptr;
}

void ScreenCast::enter(Stage stage) {
  {
    const std::lock_guard lock(mutex_);
    stage_ = stage;
  }
  changed_.notify_all();
}

void ScreenCast::end(const LMRErrorRef& error) {
  EndHandler handler;
  {
    const std::lock_guard lock(mutex_);
    error_ = error;
    stage_ = Stage::Over;
    handler = std::move(endHandler_);
    endHandler_ = nullptr;
  }
  changed_.notify_all();
  const std::lock_guard lock(tellingMutex_);
  if (handler && g_cancellable_is_cancelled(cancellable_.get()) == FALSE) {
    handler(error);
  }
}

std::optional<ScreenStream> ScreenCast::await(std::chrono::milliseconds patience, LMRErrorRef& error) {
  std::unique_lock lock(mutex_);
  changed_.wait_for(lock, patience, [this] { return stage_ == Stage::Shown || stage_ == Stage::Over; });
  switch (stage_) {
  case Stage::Shown:
    return ScreenStream{remote_.get(), node_};
  case Stage::Over:
    error = error_;
    break;
  case Stage::Asking:
    error = screenError(CaptureErrorCode::ScreenNotAllowedYet,
                        "The desktop is asking the user for the screen, and there is no answer yet");
    break;
  case Stage::Preparing:
    error = portalTimedOut();
    break;
  }
  return std::nullopt;
}

bool ScreenCast::isAsking() const {
  const std::lock_guard lock(mutex_);
  return stage_ == Stage::Asking;
}

void ScreenCast::whenEnded(EndHandler handler) {
  LMRErrorRef error;
  {
    const std::lock_guard lock(mutex_);
    if (stage_ != Stage::Over) {
      endHandler_ = std::move(handler);
      return;
    }
    error = error_;
  }
  handler(error);
}

// What the handler fails may go once this has returned.
void ScreenCast::close() {
  g_cancellable_cancel(cancellable_.get());
  g_main_context_wakeup(context_.get());
  const std::lock_guard lock(tellingMutex_);
}

} // namespace lumora::backend
