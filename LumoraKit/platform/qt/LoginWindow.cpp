#include "ui_ServerLoginWindow.h"

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/qt/DesignLayout.h>
#include <LumoraKit/platform/qt/LocalizedText.h>
#include <LumoraKit/platform/qt/LoginPanel.h>
#include <LumoraKit/platform/qt/LoginWindow.h>
#include <LumoraKit/platform/qt/QtViews.h>
#include <LumoraKit/platform/qt/SheetWindow.h>

#include <QAccessible>
#include <QEvent>
#include <QGuiApplication>
#include <QPainter>
#include <QPalette>
#include <QScreen>
#include <QStyle>
#include <algorithm>
#include <any>
#include <utility>

namespace lumora::qt {
namespace {

// Lengths of the Designer file, in units.
constexpr double designedWidth = 420;
constexpr double narrowestButton = 90;
constexpr double buttonMargins = 12;
constexpr double besidesButtons = 55 + 185;

constexpr int growthInMilliseconds = 140;
constexpr int errorPage = 1;

double neededBy(const FramedButton& button) {
  return std::max(narrowestButton, button.fittedWidth() + buttonMargins);
}

bool windowsPlaceThemselves() {
  return !QGuiApplication::platformName().startsWith(QLatin1String("wayland"));
}

// The last widget inside of `container` that the tab key goes to.
QWidget* lastInFocusChain(QWidget* container) {
  QWidget* last = container;
  for (QWidget* next = container->nextInFocusChain(); next != container; next = next->nextInFocusChain()) {
    if (container->isAncestorOf(next)) {
      last = next;
    }
  }
  return last;
}

} // namespace

LoginWindow::LoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner)
    : owner_(owner), ui_(std::make_unique<Ui::ServerLoginWindow>()) {
  ui_->setupUi(this);
  // In this order: the pages are children of what the window's layout places.
  for (QWidget* const host : {static_cast<QWidget*>(this), ui_->progressPage, ui_->errorPage}) {
    new DesignLayout(host); // the host owns it
  }
  ui_->serverLoginView->installEventFilter(this);
  ui_->errorTextField->installEventFilter(this);
  growth_.setDuration(growthInMilliseconds);
  growth_.setEasingCurve(QEasingCurve::OutCubic);
  connect(&growth_, &QVariantAnimation::valueChanged, this,
          [this](const QVariant& value) { setFixedHeight(value.toInt()); });
  bindButtons();
  bindPages();
  fitWidth();
  setContentHeight(height(), false);
}

LoginWindow::~LoginWindow() = default;

ServerLoginWindow LoginWindow::makeOutlets() {
  const auto refit = [this] { fitWidth(); };
  return {
      .window = nullptr,
      .serverLoginView = std::make_shared<Container>(ui_->serverLoginView, [this](QWidget* panel) { adopt(panel); }),
      .progressAndErrorTabView = std::make_shared<PagesView>(ui_->progressAndErrorTabView),
      .alertImageView = std::make_shared<StandardImageView>(ui_->alertImageView),
      .errorTextField = std::make_shared<PlainView>(ui_->errorTextField),
      .defaultButton = std::make_shared<ButtonView>(ui_->defaultButton, refit),
      .alternateButton = std::make_shared<ButtonView>(ui_->alternateButton, refit),
  };
}

// The bindings. The owner tells only while it lives, so it may be captured as it is.

void LoginWindow::bindButtons() {
  connect(ui_->defaultButton, &QPushButton::clicked, this, [this] {
    if (const auto owner = owner_.lock()) {
      owner->connectClicked(ui_->defaultButton);
    }
  });
  connect(ui_->alternateButton, &QPushButton::clicked, this, &LoginWindow::reject);
  const auto panel = owner_.lock()->serverLoginViewController();
  const auto follow = [this, panel = panel.get()] { ui_->defaultButton->setEnabled(panel->attemptButtonEnabled()); };
  bindings_.push_back(panel->observeAttemptButtonEnabled(follow));
  follow();
}

void LoginWindow::bindPages() {
  const auto panel = owner_.lock()->serverLoginViewController();
  bindings_.push_back(panel->observeCurrentLoginActionRunning([this] { showTexts(); }));
  connect(ui_->progressAndErrorTabView, &QStackedWidget::currentChanged, this, [this](int page) {
    if (page == errorPage) {
      QAccessibleEvent alert(ui_->errorTextField, QAccessible::Alert);
      QAccessible::updateAccessibility(&alert);
    }
  });
  showTexts();
}

void LoginWindow::showTexts() {
  const auto owner = owner_.lock();
  const auto action = owner ? owner->serverLoginViewController()->currentLoginAction() : nullptr;
  const auto error = action ? action->error() : nullptr;
  const QString progress = action ? QString::fromStdString(action->description()) : QString();
  ui_->progressTextField->setFullText(progress);
  ui_->progressIndicator->setAccessibleName(progress);
  ui_->errorTextField->setFullText(error ? QString::fromStdString(error->localizedDescription()) : QString());
}

// Closing the window and the Escape key as well.
void LoginWindow::reject() {
  if (const auto owner = owner_.lock()) {
    owner->cancelClicked(ui_->alternateButton);
  } else {
    hide();
  }
}

// Sizes.

void LoginWindow::adopt(QWidget* panel) {
  panel_ = panel;
  setTabOrder(lastInFocusChain(panel), ui_->defaultButton);
  setTabOrder(ui_->defaultButton, ui_->alternateButton);
  fitWidth();
}

void LoginWindow::fitWidth() {
  const auto* const panel = dynamic_cast<const LoginPanel*>(panel_.data());
  const double needed = std::max({designedWidth, panel ? panel->neededWidth() : 0,
                                  neededBy(*ui_->defaultButton) + neededBy(*ui_->alternateButton) + besidesButtons});
  setFixedWidth(std::min(qRound(needed * DesignLayout::unitOf(this)), screen()->availableGeometry().width()));
  hangFromParent();
}

void LoginWindow::setContentHeight(double height, bool animate) {
  contentHeight_ = height;
  growth_.stop();
  const int pixels = qRound(height * DesignLayout::unitOf(this));
  const bool isStill = style()->styleHint(QStyle::SH_Widget_Animation_Duration, nullptr, this) == 0;
  if (!animate || isStill || !isVisible()) {
    setFixedHeight(pixels);
    return;
  }
  growth_.setStartValue(this->height());
  growth_.setEndValue(pixels);
  growth_.start();
}

// The controller places the error's text only.
void LoginWindow::fitProgressText() {
  const QRectF frame = DesignLayout::of(ui_->errorPage)->frame(ui_->errorTextField);
  DesignLayout::of(ui_->progressPage)->setFrame(ui_->progressTextField, frame);
}

void LoginWindow::fit() {
  fitWidth();
  setContentHeight(contentHeight_, false);
}

// With another font the titles need other widths, so the owner lays out its controls anew.
void LoginWindow::changeEvent(QEvent* event) {
  QDialog::changeEvent(event);
  const auto owner = owner_.lock();
  if (!owner || !panel_) {
    return;
  }
  if (event->type() == QEvent::FontChange || event->type() == QEvent::StyleChange) {
    fit();
    showCautionIcon(*ui_->alertImageView);
    Platform::current().notificationCenter->post(LMRServerLoginViewDidChangeEffectiveSize,
                                                 std::any(owner->serverLoginViewController()));
  } else if (event->type() == QEvent::LanguageChange) {
    setWindowTitle(localizedText("Log In"));
  }
}

// The sheet.

void LoginWindow::present(QWidget* parentWidget, QWindow* parentWindow) {
  const bool hasParent = parentWidget || parentWindow;
  stopFollowing();
  isHanging_ = hasParent && windowsPlaceThemselves();
  parentWindow_ = parentWidget ? nullptr : parentWindow;
  setParent(parentWidget ? parentWidget->window() : nullptr,
            isHanging_ ? Qt::Sheet | Qt::FramelessWindowHint : Qt::Dialog);
  setWindowModality(hasParent ? Qt::WindowModal : Qt::NonModal);
  if (hasParent) {
    followed()->installEventFilter(this);
  }
  if (parentWindow_) {
    winId(); // makes the handle
    windowHandle()->setTransientParent(parentWindow_);
  }
  hangFromParent();
  if (panel_) {
    panel_->setFocus(Qt::ActiveWindowFocusReason);
  }
  show();
  raise();
  activateWindow();
}

void LoginWindow::end() {
  growth_.stop();
  stopFollowing();
  hide();
}

// The parent, whose moves are followed.
QObject* LoginWindow::followed() const {
  return parentWindow_ ? static_cast<QObject*>(parentWindow_) : parentWidget();
}

void LoginWindow::stopFollowing() {
  if (QObject* const parent = followed()) {
    parent->removeEventFilter(this);
  }
}

QRect LoginWindow::geometryOfParent() const {
  return parentWindow_ ? parentWindow_->geometry() : parentWidget() ? parentWidget()->geometry() : QRect();
}

void LoginWindow::hangFromParent() {
  const QRect parent = geometryOfParent();
  if (!isHanging_ || parent.isNull()) {
    return;
  }
  const QScreen* const shown = QGuiApplication::screenAt(parent.center());
  const QRect room = (shown ? shown : screen())->availableGeometry();
  const int centered = parent.x() + (parent.width() - width()) / 2;
  move(std::clamp(centered, room.left(), std::max(room.left(), room.right() + 1 - width())), parent.y());
}

// A click on the blocked parent gives it the keyboard, with which it does nothing.
void LoginWindow::takeKeyboardBack() {
  if (isVisible()) {
    raise();
    activateWindow();
  }
}

bool LoginWindow::eventFilter(QObject* watched, QEvent* event) {
  const auto type = event->type();
  if (watched == ui_->serverLoginView) {
    if (type == QEvent::Resize && panel_) {
      panel_->setGeometry(ui_->serverLoginView->rect());
    }
  } else if (watched == ui_->errorTextField) {
    if (type == QEvent::Resize) {
      fitProgressText();
    }
  } else if (type == QEvent::Move || type == QEvent::Resize) {
    hangFromParent();
  } else if (type == QEvent::WindowActivate || type == QEvent::FocusIn) {
    Platform::current().mainThread->post([window = QPointer(this)] {
      if (window) {
        window->takeKeyboardBack();
      }
    });
  }
  return false;
}

// A hairline on three sides; on the fourth one it hangs from.
void LoginWindow::paintEvent(QPaintEvent* event) {
  QDialog::paintEvent(event);
  if (isHanging_) {
    QPainter painter(this);
    QColor color = palette().color(QPalette::WindowText);
    color.setAlphaF(0.28F);
    painter.setPen(QPen(color, 1));
    painter.drawRect(rect().adjusted(0, -1, -1, -1));
  }
}

ServerLoginWindow loadLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner) {
  auto* const window = new LoginWindow(owner); // the view owns it
  ServerLoginWindow outlets = window->makeOutlets();
  outlets.window = std::make_shared<SheetWindow>(window, owner);
  return outlets;
}

} // namespace lumora::qt
