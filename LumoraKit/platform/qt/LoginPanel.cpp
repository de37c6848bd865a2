#include "ui_ServerLoginView.h"

#include <LumoraKit/platform/Secret.h>
#include <LumoraKit/platform/qt/DesignLayout.h>
#include <LumoraKit/platform/qt/LocalizedText.h>
#include <LumoraKit/platform/qt/LoginPanel.h>
#include <LumoraKit/platform/qt/QtViews.h>

#include <QEvent>
#include <algorithm>
#include <array>
#include <optional>
#include <string>
#include <utility>

namespace lumora::qt {
namespace {

// Lengths of the Designer file, in units.
constexpr double margin = 20;
constexpr double gap = 8;
constexpr double markerColumn = 40;
constexpr double narrowestLabels = 116;
constexpr double narrowestFields = 200;
constexpr double checkBoxMargin = 18;

// An empty field is null.
std::optional<std::string> propertyOf(const QString& text) {
  return text.isEmpty() ? std::nullopt : std::optional(text.toStdString());
}

void showIn(QLineEdit& field, const std::optional<std::string>& property) {
  const QString text = QString::fromStdString(property.value_or(""));
  if (field.text() != text) {
    field.setText(text);
  }
}

double neededBy(const QWidget& widget) {
  return widget.sizeHint().width() / DesignLayout::unitOf(&widget);
}

void placeHorizontally(DesignLayout& layout, const QWidget* child, double left, double right) {
  QRectF frame = layout.frame(child);
  frame.setLeft(left);
  frame.setRight(right);
  layout.setFrame(child, frame);
}

} // namespace

LoginPanel::LoginPanel(const std::shared_ptr<LMRServerLoginViewController>& owner)
    : owner_(owner), ui_(std::make_unique<Ui::ServerLoginView>()) {
  ui_->setupUi(this);
  new DesignLayout(this); // its host owns it
  setFocusProxy(ui_->serverComboBox);
  ui_->passwordTextField->setInputMethodHints(Qt::ImhHiddenText | Qt::ImhSensitiveData | Qt::ImhNoPredictiveText |
                                              Qt::ImhNoAutoUppercase);
  bindUserName();
  bindPassword();
  bindRememberPassword();
  describe();
  alignLabels();
}

LoginPanel::~LoginPanel() = default;

// What assistive software needs besides the texts of the Designer file.
void LoginPanel::describe() {
  // The keyboard is in the line edit inside of the combo box.
  ui_->serverComboBox->lineEdit()->setAccessibleName(ui_->serverComboBox->accessibleName());
  for (QWidget* const marker : std::array<QWidget*, 3>{ui_->serverRequiredImageView, ui_->userNameRequiredImageView,
                                                       ui_->passwordRequiredImageView}) {
    marker->setAccessibleName(localizedText("Required"));
    marker->setToolTip(localizedText("Required"));
  }
  fitLabelColumn();
}

// The bindings. The owner tells only while it lives, so it may be captured as it is.

void LoginPanel::bindUserName() {
  const auto follow = [this, owner = owner_.lock().get()] { showIn(*ui_->userNameTextField, owner->userName()); };
  bindings_.push_back(owner_.lock()->observeUserName(follow));
  follow();
}

void LoginPanel::bindPassword() {
  connect(ui_->passwordTextField, &QLineEdit::textEdited, this, [this](const QString& text) {
    if (const auto owner = owner_.lock()) {
      owner->setPassword(propertyOf(text));
    }
  });
  const auto follow = [this, owner = owner_.lock().get()] {
    auto password = owner->password();
    showIn(*ui_->passwordTextField, password);
    if (password) {
      wipe(*password);
    }
  };
  bindings_.push_back(owner_.lock()->observePassword(follow));
  follow();
}

void LoginPanel::bindRememberPassword() {
  connect(ui_->rememberPasswordInKeychainButton, &QCheckBox::clicked, this, [this](bool isTicked) {
    if (const auto owner = owner_.lock()) {
      owner->setRememberPasswordInKeychain(isTicked);
    }
  });
  const auto follow = [this, owner = owner_.lock().get()] {
    ui_->rememberPasswordInKeychainButton->setChecked(owner->rememberPasswordInKeychain());
  };
  bindings_.push_back(owner_.lock()->observeRememberPasswordInKeychain(follow));
  follow();
}

// The outlets.

ServerLoginView LoginPanel::makeOutlets() {
  const auto comboBox = std::make_shared<KTServiceComboBox>(std::make_shared<ComboBoxView>(ui_->serverComboBox));
  const auto userName = std::make_shared<FieldView>(ui_->userNameTextField);
  report(comboBox);
  reportUserName(userName);
  return {
      .view = std::make_shared<OwnedView>(this),
      .serverComboBox = comboBox,
      .userNameLabelTextField = std::make_shared<PlainView>(ui_->userNameLabelTextField),
      .userNameTextField = userName,
      .passwordLabelTextField = std::make_shared<PlainView>(ui_->passwordLabelTextField),
      .passwordTextField = std::make_shared<FieldView>(ui_->passwordTextField),
      .rememberPasswordInKeychainButton = std::make_shared<PlainView>(ui_->rememberPasswordInKeychainButton),
      .serverRequiredImageView =
          std::make_shared<MarkerView>(ui_->serverRequiredImageView, ui_->serverComboBox->lineEdit()),
      .userNameRequiredImageView = std::make_shared<MarkerView>(ui_->userNameRequiredImageView, ui_->userNameTextField),
      .passwordRequiredImageView = std::make_shared<MarkerView>(ui_->passwordRequiredImageView, ui_->passwordTextField),
  };
}

void LoginPanel::report(const std::shared_ptr<KTServiceComboBox>& comboBox) {
  comboBox->setAction([owner = owner_, sender = comboBox.get()] {
    if (const auto panel = owner.lock()) {
      panel->setServerName(sender);
    }
  });
  const auto tell = [weak = std::weak_ptr(comboBox)](const auto& message) {
    if (const auto receiver = weak.lock()) {
      message(*receiver);
    }
  };
  ui_->serverComboBox->setReports(
      {.changedText = [tell] { tell([](auto& receiver) { receiver.userChangedText(); }); },
       .choseItem =
           [tell](const QString& item) { tell([&](auto& receiver) { receiver.userChoseItem(item.toStdString()); }); },
       .finishedEditing = [tell] { tell([](auto& receiver) { receiver.userFinishedEditing(); }); }});
}

void LoginPanel::reportUserName(const std::shared_ptr<TextField>& field) {
  connect(ui_->userNameTextField, &QLineEdit::textEdited, this,
          [this, weak = std::weak_ptr(field)](const QString& text) {
            const auto owner = owner_.lock();
            const auto sender = weak.lock();
            if (owner && sender) {
              owner->setUserName(propertyOf(text));
              owner->controlTextDidChange(sender);
            }
          });
}

std::array<QLabel*, 3> LoginPanel::labels() const {
  return {ui_->serverLabelTextField, ui_->userNameLabelTextField, ui_->passwordLabelTextField};
}

// Beside their fields, also where the panel is mirrored and their texts are not.
void LoginPanel::alignLabels() {
  const auto side = layoutDirection() == Qt::RightToLeft ? Qt::AlignLeft : Qt::AlignRight;
  for (QLabel* const label : labels()) {
    label->setAlignment(side | Qt::AlignVCenter | Qt::AlignAbsolute);
  }
}

// A language with long labels gets a wider column of them; the fields give way.

void LoginPanel::fitLabelColumn() {
  DesignLayout& layout = *DesignLayout::of(this);
  double width = narrowestLabels;
  for (const QLabel* const label : labels()) {
    width = std::max(width, neededBy(*label) + 2);
  }
  for (const QLabel* const label : labels()) {
    placeHorizontally(layout, label, margin, margin + width);
  }
  const double left = margin + width + gap;
  for (QWidget* const field : std::array<QWidget*, 4>{ui_->serverComboBox, ui_->userNameTextField,
                                                      ui_->passwordTextField, ui_->rememberPasswordInKeychainButton}) {
    placeHorizontally(layout, field, left, layout.frame(field).right());
  }
}

double LoginPanel::neededWidth() const {
  const double fieldsLeft = DesignLayout::of(this)->frame(ui_->serverComboBox).left();
  return std::max(fieldsLeft + narrowestFields + markerColumn,
                  fieldsLeft + neededBy(*ui_->rememberPasswordInKeychainButton) + checkBoxMargin);
}

void LoginPanel::changeEvent(QEvent* event) {
  QWidget::changeEvent(event);
  if (!DesignLayout::of(this)) {
    return;
  }
  if (event->type() == QEvent::LanguageChange) {
    ui_->retranslateUi(this);
    describe();
  } else if (event->type() == QEvent::FontChange || event->type() == QEvent::StyleChange) {
    fitLabelColumn();
  } else if (event->type() == QEvent::LayoutDirectionChange) {
    alignLabels();
  }
}

ServerLoginView loadLoginPanel(const std::shared_ptr<LMRServerLoginViewController>& owner) {
  auto* const panel = new LoginPanel(owner); // the view owns it
  return panel->makeOutlets();
}

} // namespace lumora::qt
