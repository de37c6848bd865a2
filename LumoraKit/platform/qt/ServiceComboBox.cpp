#include <LumoraKit/platform/qt/ServiceComboBox.h>
#include <LumoraKit/platform/qt/ServiceList.h>

#include <QAbstractItemView>
#include <QApplication>
#include <QFocusEvent>
#include <QInputMethod>
#include <QKeyEvent>
#include <QLineEdit>
#include <QWheelEvent>
#include <utility>

namespace lumora::qt {
namespace {

constexpr int visibleServices = 12;

bool isReturn(const QKeyEvent& event) {
  return event.key() == Qt::Key_Return || event.key() == Qt::Key_Enter;
}

bool isStep(const QKeyEvent& event) {
  const int key = event.key();
  return key == Qt::Key_Up || key == Qt::Key_Down || key == Qt::Key_PageUp || key == Qt::Key_PageDown;
}

// Whether the keyboard went to another field, rather than to another window or to a list or menu over this one.
bool leavesTheField(const QFocusEvent& event) {
  const auto reason = event.reason();
  return reason != Qt::ActiveWindowFocusReason && reason != Qt::PopupFocusReason && reason != Qt::MenuBarFocusReason &&
         !QApplication::activePopupWidget();
}

// The field of the combo box. Its modified flag says whether the user has edited since the last report.
class ServiceField final : public QLineEdit {
public:
  explicit ServiceField(ServiceComboBox* comboBox) : QLineEdit(comboBox), comboBox_(comboBox) {}
  ServiceField(const ServiceField&) = delete;
  ServiceField& operator=(const ServiceField&) = delete;
  ~ServiceField() override = default;

protected:
  void focusOutEvent(QFocusEvent* event) override {
    QLineEdit::focusOutEvent(event);
    // A window that closes takes the keyboard away, too.
    if (leavesTheField(*event) && isVisible()) {
      comboBox_->finishEditing();
    }
  }

  // The Return that ends an edit does not press the default button as well: what it would do depends on the answer.
  void keyPressEvent(QKeyEvent* event) override {
    QLineEdit::keyPressEvent(event);
    if (isReturn(*event) && isModified()) {
      comboBox_->finishEditing();
      event->accept();
    }
  }

private:
  ServiceComboBox* const comboBox_;
};

} // namespace

ServiceComboBox::ServiceComboBox(QWidget* parent) : QComboBox(parent), list_(new ServiceList(this)) {
  setModel(list_);
  setInsertPolicy(QComboBox::NoInsert);
  setMaxVisibleItems(visibleServices);
  setFocusPolicy(Qt::StrongFocus);
  // Names of any length are listed, so none is measured.
  setSizeAdjustPolicy(QComboBox::AdjustToMinimumContentsLengthWithIcon);
  makeEditable();
  connect(this, &QComboBox::activated, this, [this](int row) { choose(row); });
}

ServiceComboBox::~ServiceComboBox() = default;

void ServiceComboBox::makeEditable() {
  setEditable(true);
  auto* const field = new ServiceField(this);
  setLineEdit(field);
  setCompleter(nullptr);
  // On these the combo box looks for an item that equals the text, and takes it for chosen.
  disconnect(field, &QLineEdit::editingFinished, this, nullptr);
  disconnect(field, &QLineEdit::returnPressed, this, nullptr);
  connect(field, &QLineEdit::textEdited, this, [this] {
    if (!isEnding_ && reports_.changedText) {
      reports_.changedText();
    }
  });
}

void ServiceComboBox::addName(const QString& name) {
  list_->add(name);
}

void ServiceComboBox::removeName(const QString& name) {
  list_->remove(name);
}

void ServiceComboBox::setText(const QString& text) {
  if (lineEdit()->text() != text) {
    lineEdit()->setText(text);
  }
  lineEdit()->setModified(false);
}

void ServiceComboBox::endEditing() {
  if (std::exchange(isEnding_, true)) {
    return;
  }
  if (lineEdit()->hasFocus()) {
    QGuiApplication::inputMethod()->commit();
  }
  if (hasOpenedList_ && view()->isVisible()) {
    hidePopup();
  }
  lineEdit()->setModified(false);
  isEnding_ = false;
}

void ServiceComboBox::finishEditing() {
  if (lineEdit()->isModified()) {
    lineEdit()->setModified(false);
    if (reports_.finishedEditing) {
      reports_.finishedEditing();
    }
  }
}

void ServiceComboBox::choose(int row) {
  const QString name = itemText(row);
  setCurrentIndex(-1);
  setText(name);
  if (reports_.choseItem) {
    reports_.choseItem(name);
  }
}

// The list's widgets are made by the first look at it.
void ServiceComboBox::showPopup() {
  hasOpenedList_ = true;
  view()->setTextElideMode(Qt::ElideMiddle);
  QComboBox::showPopup();
}

void ServiceComboBox::wheelEvent(QWheelEvent* event) {
  event->ignore();
}

// With the list closed, keys open it; they would else choose, and thereby ask, one server after the other.
void ServiceComboBox::keyPressEvent(QKeyEvent* event) {
  if (isStep(*event)) {
    showPopup();
  } else {
    QComboBox::keyPressEvent(event);
  }
}

} // namespace lumora::qt
