#pragma once

#include <QAbstractListModel>
#include <QStringList>

namespace lumora::qt {

/// The names of a ServiceComboBox, sorted. A combo box makes the first row of an empty list its current one, and
/// empties its field with the last row: both changes are told as changes of the layout, of which it takes no notice.
class ServiceList final : public QAbstractListModel {
public:
  explicit ServiceList(QObject* parent);
  ServiceList(const ServiceList&) = delete;
  ServiceList& operator=(const ServiceList&) = delete;
  ~ServiceList() override;

  void add(const QString& name);
  void remove(const QString& name);

  int rowCount(const QModelIndex& parent = {}) const override;
  QVariant data(const QModelIndex& index, int role) const override;

private:
  void replaceAll(const QStringList& names);

  QStringList names_;
};

} // namespace lumora::qt
