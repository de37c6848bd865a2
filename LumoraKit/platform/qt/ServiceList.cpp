#include <LumoraKit/platform/qt/ServiceList.h>

#include <algorithm>

namespace lumora::qt {

ServiceList::ServiceList(QObject* parent) : QAbstractListModel(parent) {}

ServiceList::~ServiceList() = default;

int ServiceList::rowCount(const QModelIndex& parent) const {
  return parent.isValid() ? 0 : static_cast<int>(names_.size());
}

QVariant ServiceList::data(const QModelIndex& index, int role) const {
  const bool isText = role == Qt::DisplayRole || role == Qt::EditRole;
  return isText && index.row() < names_.size() ? QVariant(names_.at(index.row())) : QVariant();
}

void ServiceList::add(const QString& name) {
  const auto place = std::ranges::upper_bound(names_, name, [](const QString& left, const QString& right) {
    return QString::localeAwareCompare(left, right) < 0;
  });
  const int row = static_cast<int>(place - names_.begin());
  if (names_.isEmpty()) {
    replaceAll({name});
    return;
  }
  beginInsertRows({}, row, row);
  names_.insert(row, name);
  endInsertRows();
}

void ServiceList::remove(const QString& name) {
  const int row = static_cast<int>(names_.indexOf(name));
  if (row < 0) {
    return;
  }
  if (names_.size() == 1) {
    replaceAll({});
    return;
  }
  beginRemoveRows({}, row, row);
  names_.removeAt(row);
  endRemoveRows();
}

void ServiceList::replaceAll(const QStringList& names) {
  emit layoutAboutToBeChanged();
  for (const QModelIndex& index : persistentIndexList()) {
    changePersistentIndex(index, {});
  }
  names_ = names;
  emit layoutChanged();
}

} // namespace lumora::qt
