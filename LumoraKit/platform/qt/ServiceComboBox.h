#pragma once

#include <QComboBox>
#include <QString>
#include <functional>
#include <utility>

class QKeyEvent;
class QWheelEvent;

namespace lumora::qt {

class ServiceList;

/// An editable combo box whose list changes while the user types. An ordinary one overwrites the text then, completes
/// it, and takes a typed text that equals an item for a choice. Here the list is only something to choose from: no item
/// is ever the current one, and an item gets into the field by a choice from the open list alone.
class ServiceComboBox final : public QComboBox {
public:
  /// What the user does.
  struct Reports {
    std::function<void()> changedText;
    std::function<void(const QString& item)> choseItem;
    /// Return, or a change to another field; not the opening of the list, nor a change to another window.
    std::function<void()> finishedEditing;
  };

  explicit ServiceComboBox(QWidget* parent = nullptr);
  ServiceComboBox(const ServiceComboBox&) = delete;
  ServiceComboBox& operator=(const ServiceComboBox&) = delete;
  ~ServiceComboBox() override;

  void setReports(Reports reports) { reports_ = std::move(reports); }

  /// The list is kept in the order of the user's language.
  void addName(const QString& name);
  void removeName(const QString& name);
  void setText(const QString& text);
  /// Ends a composition and closes the list, without a report.
  void endEditing();

  /// The user has: a report, when there was an edit.
  void finishEditing();

  void showPopup() override;

protected:
  void wheelEvent(QWheelEvent* event) override;
  void keyPressEvent(QKeyEvent* event) override;

private:
  void makeEditable();
  void choose(int row);

  ServiceList* const list_;
  Reports reports_;
  bool isEnding_ = false;
  bool hasOpenedList_ = false;
};

} // namespace lumora::qt
