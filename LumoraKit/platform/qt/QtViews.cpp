#include <LumoraKit/platform/qt/DesignLayout.h>
#include <LumoraKit/platform/qt/LocalizedText.h>
#include <LumoraKit/platform/qt/QtViews.h>

#include <QAccessible>
#include <QGuiApplication>
#include <QIcon>
#include <QInputMethod>
#include <QSignalBlocker>
#include <QStyle>

namespace lumora::qt {
namespace {

constexpr double alertImageSize = 20;

double heightOfParent(const QWidget& widget) {
  const QWidget* const parent = widget.isWindow() ? nullptr : widget.parentWidget();
  return parent ? parent->height() / DesignLayout::unitOf(parent) : 0;
}

} // namespace

Rect frameOf(const QWidget& widget) {
  const DesignLayout* const layout = DesignLayout::of(widget.parentWidget());
  const double unit = DesignLayout::unitOf(&widget);
  const QRectF frame =
      layout ? layout->frame(&widget) : QRectF(QPointF(widget.pos()) / unit, QSizeF(widget.size()) / unit);
  return {frame.x(), heightOfParent(widget) - frame.y() - frame.height(), frame.width(), frame.height()};
}

void setFrameOf(QWidget& widget, const Rect& frame) {
  const QRectF placed(frame.x, heightOfParent(widget) - frame.y - frame.height, frame.width, frame.height);
  if (DesignLayout* const layout = DesignLayout::of(widget.parentWidget())) {
    layout->setFrame(&widget, placed);
    return;
  }
  const double unit = DesignLayout::unitOf(&widget);
  widget.setGeometry(QRectF(placed.topLeft() * unit, placed.size() * unit).toRect());
}

WidgetHolder::~WidgetHolder() = default;

// Deleted later: the view may die in a report of the widget.
OwnedView::OwnedView(QWidget* widget) : ViewOf(widget) {}
OwnedView::~OwnedView() {
  if (QWidget* const owned = widget()) {
    owned->hide();
    owned->deleteLater();
  }
}

MarkerView::MarkerView(QWidget* marker, QWidget* field) : ViewOf(marker), field_(field) {}
MarkerView::~MarkerView() = default;

void MarkerView::setHidden(bool hidden) {
  if (!widget() || isHidden() == hidden) {
    return;
  }
  ViewOf::setHidden(hidden);
  if (field_) {
    field_->setAccessibleDescription(hidden ? QString() : localizedText("Required"));
  }
  if (!hidden) {
    QAccessibleEvent alert(widget(), QAccessible::Alert);
    QAccessible::updateAccessibility(&alert);
  }
}

FieldView::FieldView(QLineEdit* field) : ViewOf(field) {}
FieldView::~FieldView() = default;

std::string FieldView::stringValue() const {
  return widget() ? widget()->text().toStdString() : std::string();
}

void FieldView::setStringValue(const std::string& text) {
  if (widget() && stringValue() != text) {
    widget()->setText(QString::fromStdString(text));
  }
}

void FieldView::makeFirstResponder() {
  if (widget() && !widget()->hasFocus()) {
    widget()->setFocus(Qt::OtherFocusReason);
    widget()->selectAll();
  }
}

void FieldView::endEditing() {
  if (widget() && widget()->hasFocus()) {
    const QSignalBlocker blocker(widget());
    QGuiApplication::inputMethod()->commit();
  }
}

ComboBoxView::ComboBoxView(ServiceComboBox* comboBox) : ViewOf(comboBox) {}
ComboBoxView::~ComboBoxView() = default;

std::string ComboBoxView::stringValue() const {
  return widget() ? widget()->currentText().toStdString() : std::string();
}

void ComboBoxView::setStringValue(const std::string& text) {
  if (widget()) {
    widget()->setText(QString::fromStdString(text));
  }
}

void ComboBoxView::makeFirstResponder() {
  if (widget()) {
    widget()->setFocus(Qt::OtherFocusReason);
  }
}

void ComboBoxView::endEditing() {
  if (widget()) {
    widget()->endEditing();
  }
}

void ComboBoxView::addItem(const std::string& item) {
  if (widget()) {
    widget()->addName(QString::fromStdString(item));
  }
}

void ComboBoxView::removeItem(const std::string& item) {
  if (widget()) {
    widget()->removeName(QString::fromStdString(item));
  }
}

ButtonView::ButtonView(FramedButton* button, std::function<void()> titleChanged)
    : ViewOf(button), titleChanged_(std::move(titleChanged)) {}
ButtonView::~ButtonView() = default;

void ButtonView::setTitle(const std::string& title) {
  if (widget()) {
    widget()->setTitle(QString::fromStdString(title));
    titleChanged_();
  }
}

void ButtonView::sizeToFit() {
  if (widget()) {
    const Rect old = frame();
    setFrame({old.x, old.y, widget()->fittedWidth(), old.height});
  }
}

void showCautionIcon(QLabel& label) {
  const int size = qRound(alertImageSize * DesignLayout::unitOf(&label));
  const QIcon icon = label.style()->standardIcon(QStyle::SP_MessageBoxWarning, nullptr, &label);
  label.setPixmap(icon.pixmap(QSize(size, size), label.devicePixelRatioF()));
}

StandardImageView::StandardImageView(QLabel* label) : ViewOf(label) {}
StandardImageView::~StandardImageView() = default;

void StandardImageView::setImage(SystemImage image) {
  if (widget() && image == SystemImage::Caution) {
    showCautionIcon(*widget());
  }
}

PagesView::PagesView(QStackedWidget* pages) : ViewOf(pages) {}
PagesView::~PagesView() = default;

void PagesView::selectPage(int page) {
  if (widget()) {
    widget()->setCurrentIndex(page);
  }
}

Container::Container(QWidget* container, std::function<void(QWidget*)> subviewChanged)
    : ViewOf(container), subviewChanged_(std::move(subviewChanged)) {}
Container::~Container() = default;

void Container::setSubview(const std::shared_ptr<View>& view) {
  if (!widget()) {
    return;
  }
  const auto* const holder = dynamic_cast<const WidgetHolder*>(view.get());
  QWidget* const next = holder ? holder->widget() : nullptr;
  if (subview_ && subview_ != next && subview_->parentWidget() == widget()) {
    subview_->hide();
    subview_->setParent(nullptr);
  }
  subview_ = next;
  if (next) {
    next->setParent(widget());
    next->setGeometry(widget()->rect());
    next->show();
    subviewChanged_(next);
  }
}

} // namespace lumora::qt
