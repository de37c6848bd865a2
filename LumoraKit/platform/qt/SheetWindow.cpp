#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/qt/DesignLayout.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>
#include <LumoraKit/platform/qt/SheetWindow.h>

#include <QScreen>
#include <utility>

namespace lumora::qt {
namespace {

constexpr double titleBarHeight = 22;

// The other way round is the same.
QRect flipped(const QRect& frame, const QScreen* screen) {
  const QRect room = screen ? screen->geometry() : QRect();
  return {frame.x(), room.y() + room.height() - frame.y() - frame.height(), frame.width(), frame.height()};
}

} // namespace

std::shared_ptr<Window> windowOf(QWidget* widget) {
  return std::make_shared<ApplicationWindow>(widget);
}

std::shared_ptr<Window> windowOf(QWindow* window) {
  return std::make_shared<ApplicationWindow>(window);
}

ApplicationWindow::ApplicationWindow(QWidget* widget) : widget_(widget) {}
ApplicationWindow::ApplicationWindow(QWindow* window) : window_(window) {}
ApplicationWindow::~ApplicationWindow() = default;

Rect ApplicationWindow::frame() const {
  QRectF frame;
  if (widget_) {
    frame = flipped(widget_->window()->frameGeometry(), widget_->screen());
  } else if (window_) {
    frame = flipped(window_->frameGeometry(), window_->screen());
  }
  return {frame.x(), frame.y(), frame.width(), frame.height()};
}

void ApplicationWindow::setFrame_display_animate(const Rect& frame, bool /*display*/, bool /*animate*/) {
  const QRect outer = QRectF(frame.x, frame.y, frame.width, frame.height).toRect();
  if (widget_) {
    QWidget& window = *widget_->window();
    const QSize decoration = window.frameGeometry().size() - window.size();
    window.resize(outer.size() - decoration);
    window.move(flipped(outer, widget_->screen()).topLeft());
  } else if (window_) {
    window_->resize(outer.size() - (window_->frameGeometry().size() - window_->size()));
    window_->setFramePosition(flipped(outer, window_->screen()).topLeft());
  }
}

void ApplicationWindow::beginSheet(const std::shared_ptr<Window>& /*parent*/, DidEnd /*didEnd*/) {}

void ApplicationWindow::endSheet(int /*returnCode*/) {}

SheetWindow::SheetWindow(LoginWindow* window, const std::shared_ptr<LMRServerLoginSheetController>& owner)
    : window_(window), owner_(owner) {
  windowDestroyed_ = QObject::connect(window, &QObject::destroyed, [this] { cancelLater(); });
}

// Deleted later: this object may die in a report of the window.
SheetWindow::~SheetWindow() {
  QObject::disconnect(windowDestroyed_);
  if (window_) {
    window_->end();
    window_->deleteLater();
  }
}

double SheetWindow::titleBar() const {
  return isSheet_ ? 0 : titleBarHeight;
}

Rect SheetWindow::frame() const {
  if (!window_) {
    return {};
  }
  return {0, 0, window_->width() / DesignLayout::unitOf(window_), window_->contentHeight() + titleBar()};
}

void SheetWindow::setFrame_display_animate(const Rect& frame, bool /*display*/, bool animate) {
  if (window_) {
    window_->setContentHeight(frame.height - titleBar(), animate);
  }
}

void SheetWindow::beginSheet(const std::shared_ptr<Window>& parent, DidEnd didEnd) {
  didEnd_ = std::move(didEnd);
  if (!window_) {
    cancelLater();
    return;
  }
  const auto* const application = dynamic_cast<const ApplicationWindow*>(parent.get());
  const auto* const sheet = dynamic_cast<const SheetWindow*>(parent.get());
  QWidget* const parentWidget = application ? application->widget() : sheet ? sheet->window() : nullptr;
  QWindow* const parentWindow = application ? application->window() : nullptr;
  isSheet_ = parentWidget || parentWindow;
  if (parentWindow) {
    QObject::connect(parentWindow, &QObject::destroyed, window_, [weak = weak_from_this()] {
      if (const auto self = weak.lock()) {
        self->cancelLater();
      }
    });
  }
  window_->present(parentWidget, parentWindow);
}

void SheetWindow::endSheet(int returnCode) {
  if (window_ && didEnd_) {
    window_->end();
  }
  isSheet_ = false;
  if (const auto didEnd = std::exchange(didEnd_, nullptr)) {
    didEnd(returnCode);
  }
}

void SheetWindow::cancelLater() {
  if (!didEnd_) {
    return;
  }
  Platform::current().mainThread->post([weak = weak_from_this()] {
    const auto self = weak.lock();
    const auto owner = self ? self->owner_.lock() : nullptr;
    if (owner && self->didEnd_) {
      owner->cancelClicked(self.get());
    }
  });
}

} // namespace lumora::qt
