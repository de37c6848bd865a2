#include <LumoraKit/login/LMRLocalizedString.h>
#include <LumoraKit/login/LMRLoginFlags.h>
#include <LumoraKit/login/LMRServerLoginSheetController.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>

#include <algorithm>
#include <utility>

using LMRLoginFlags::isEmpty;
using lumora::Platform;
using lumora::Rect;

namespace {

enum Page { ProgressPage = 0, ErrorPage = 1, BlankPage = 2 };

bool disablesRememberedPasswords(const std::any& contextInfo) {
  const auto* const context = std::any_cast<lumora::Dictionary>(&contextInfo);
  return context && LMRLoginFlags::isTrue(context->find(lumora::LoginRememberPasswordDisabledKey));
}

// The width of a button that fits its title, without its margins.
double fittedWidth(const std::shared_ptr<lumora::Button>& button) {
  if (!button) {
    return 0;
  }
  button->sizeToFit();
  return button->frame().width;
}

double buttonWidth(const std::shared_ptr<lumora::Button>& button) {
  return std::max(90.0, fittedWidth(button) + 12.0);
}

void placeHorizontally(const std::shared_ptr<lumora::View>& view, double x, double width) {
  if (view) {
    const Rect old = view->frame();
    view->setFrame({x, old.y, width, old.height});
  }
}

} // namespace

LMRServerLoginSheetController::LMRServerLoginSheetController()
    : serverLoginViewController_(std::make_shared<LMRServerLoginViewController>()) {}

LMRServerLoginSheetController::~LMRServerLoginSheetController() = default;

void LMRServerLoginSheetController::beginSheet(const std::shared_ptr<lumora::Window>& parent,
                                               const std::optional<std::string>& defaultTitle,
                                               const std::optional<std::string>& alternateTitle,
                                               const DidEndMessage& didEnd, const std::any& contextInfo) {
  lumora::assertThat(Platform::current().mainThread->isCurrent(), "on the main thread",
                     "beginSheetModalForWindow:defaultButtonTitle:alternateButtonTitle:modalDelegate:"
                     "didEndSelector:contextInfo:",
                     "LMRServerLoginSheetController");
  setDefaultButtonTitle(isEmpty(defaultTitle) ? LMRLocalizedString("Connect") : defaultTitle);
  setAlternateButtonTitle(isEmpty(alternateTitle) ? LMRLocalizedString("Cancel") : alternateTitle);
  kioskModeEnabled_ = disablesRememberedPasswords(contextInfo);
  loadWindow();
  if (!outlets_.window) {
    Platform::current().mainThread->post([didEnd, contextInfo] { didEnd(nullptr, Cancelled, contextInfo); });
    return;
  }
  outlets_.window->beginSheet(parent, [didEnd, contextInfo, weak = std::weak_ptr(outlets_.window)](int returnCode) {
    didEnd(weak.lock(), returnCode, contextInfo);
  });
}

void LMRServerLoginSheetController::loadWindow() {
  if (std::exchange(isWindowLoaded_, true)) {
    return;
  }
  outlets_ = Platform::current().userInterface->loadServerLoginWindow(shared_from_this());
  awakeFromNib();
  windowDidLoad();
}

void LMRServerLoginSheetController::awakeFromNib() {
  runningConnection_ = serverLoginViewController_->observeCurrentLoginActionRunning([this] { choosePage(); });
}

void LMRServerLoginSheetController::windowDidLoad() {
  if (outlets_.serverLoginView) {
    outlets_.serverLoginView->setSubview(serverLoginViewController_->view());
  }
  serverLoginViewController_->setIsKioskMode(kioskModeEnabled_);
  if (outlets_.alertImageView) {
    outlets_.alertImageView->setImage(lumora::SystemImage::Caution);
  }
  if (outlets_.defaultButton) {
    outlets_.defaultButton->setTitle(defaultButtonTitle().value_or(""));
  }
  if (outlets_.alternateButton) {
    outlets_.alternateButton->setTitle(alternateButtonTitle().value_or(""));
  }
  layout();
  sizeConnection_ = Platform::current().notificationCenter->observe(
      LMRServerLoginViewDidChangeEffectiveSize, [this](const std::any& object) {
        const auto* const panel = std::any_cast<std::shared_ptr<LMRServerLoginViewController>>(&object);
        if (panel && *panel == serverLoginViewController_) {
          layout();
        }
      });
}

// The buttons.

void LMRServerLoginSheetController::connectClicked(const void* /*sender*/) {
  serverLoginViewController_->attemptToLogInToServerWithTarget_selector(
      shared_from_this(), &LMRServerLoginSheetController::loggedInToServer);
}

void LMRServerLoginSheetController::loggedInToServer() {
  serverLoginViewController_->stopBrowsingForServers();
  endSheet(LoggedIn);
}

void LMRServerLoginSheetController::cancelClicked(const void* /*sender*/) {
  if (const auto action = serverLoginViewController_->currentLoginAction()) {
    action->setFinishTarget(nullptr);
  }
  serverLoginViewController_->setCurrentLoginAction(nullptr);
  endSheet(Cancelled);
}

// The delegate may drop this object, so it is held meanwhile.
void LMRServerLoginSheetController::endSheet(int returnCode) {
  const auto self = shared_from_this();
  if (const auto window = outlets_.window) {
    window->endSheet(returnCode);
  }
}

// Progress and errors.

void LMRServerLoginSheetController::choosePage() {
  const auto action = serverLoginViewController_->currentLoginAction();
  if (action && action->isRunning()) {
    selectPage(ProgressPage);
  } else if (action && action->error() && !LMRLoginFlags::isAutomaticLogin(action)) {
    selectPage(ErrorPage);
  } else {
    selectPage(BlankPage);
  }
}

void LMRServerLoginSheetController::selectPage(int page) {
  if (outlets_.progressAndErrorTabView) {
    outlets_.progressAndErrorTabView->selectPage(page);
  }
}

// Layout.

void LMRServerLoginSheetController::layout() {
  layoutLowerControls();
  selectPage(BlankPage);
  if (const auto& window = outlets_.window) {
    const double titleBar = window->isSheet() ? 0.0 : 22.0;
    const double height = serverLoginViewController_->effectiveSize().height + 77.0 + titleBar;
    window->setFrame_display_animate({0, 0, window->frame().width, height}, true, true);
  }
  // The page is chosen anew by whoever observes.
  if (const auto action = serverLoginViewController_->currentLoginAction()) {
    action->notifyRunningObservers();
  }
}

void LMRServerLoginSheetController::layoutLowerControls() {
  const double width = outlets_.window ? outlets_.window->frame().width : 0;
  const double defaultWidth = buttonWidth(outlets_.defaultButton);
  const double alternateWidth = buttonWidth(outlets_.alternateButton);
  const double defaultX = width - defaultWidth - 13.0;
  placeHorizontally(outlets_.defaultButton, defaultX, defaultWidth);
  placeHorizontally(outlets_.alternateButton, defaultX - alternateWidth, alternateWidth);
  if (const auto& text = outlets_.errorTextField) {
    placeHorizontally(text, text->frame().x, width - defaultWidth - alternateWidth - 55.0);
  }
}
