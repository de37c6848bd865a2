#include "recorder/window/EpisodePanel.h"

#include "recorder/window/Words.h"

#include <LumoraKit/LumoraKit.h>

#include <QDate>
#include <QLabel>
#include <QLocale>
#include <QSignalBlocker>
#include <QVBoxLayout>

namespace recorder {

EpisodePanel::EpisodePanel(std::shared_ptr<Studio> studio, QWidget* parent)
    : QWidget(parent), studio_(std::move(studio)), workflow_(new QComboBox(this)), title_(new QLineEdit(this)),
      description_(new QPlainTextEdit(this)) {
  build();
  const auto edited = [this] { studio_->setEpisode(episode()); };
  connect(title_, &QLineEdit::textChanged, this, edited);
  connect(description_, &QPlainTextEdit::textChanged, this, edited);
  connect(workflow_, &QComboBox::activated, this,
          [this](int) { studio_->selectWorkflow(workflow_->currentData().toString().toStdString()); });
  edited();
}

void EpisodePanel::build() {
  workflow_->setObjectName("workflow");
  workflow_->setSizeAdjustPolicy(QComboBox::AdjustToMinimumContentsLengthWithIcon);
  title_->setObjectName("title");
  title_->setPlaceholderText(titleOfToday());
  description_->setObjectName("description");
  description_->setTabChangesFocus(true);
  description_->setMaximumHeight(fontMetrics().height() * 6);
  auto* const layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  const auto add = [&](Text label, QWidget* field) {
    auto* const text = new QLabel(words(label), this);
    text->setBuddy(field);
    field->setAccessibleName(text->text().remove('&'));
    layout->addWidget(text);
    layout->addWidget(field);
  };
  add("&Workflow", workflow_);
  add("&Title", title_);
  add("&Description", description_);
}

QString EpisodePanel::titleOfToday() {
  const QLocale locale(QString::fromStdString(lumora::Platform::current().application->language()));
  return words("Recording of %1").arg(locale.toString(QDate::currentDate(), words("d MMMM yyyy")));
}

Episode EpisodePanel::episode() const {
  const QString title = title_->text().trimmed();
  return {(title.isEmpty() ? titleOfToday() : title).toStdString(),
          description_->toPlainText().trimmed().toStdString()};
}

void EpisodePanel::clear() {
  title_->clear();
  description_->clear();
}

void EpisodePanel::refresh() {
  const QSignalBlocker blocker(workflow_);
  workflow_->clear();
  for (const Workflow& each : studio_->selection().workflows()) {
    workflow_->addItem(QString::fromStdString(each.title), QString::fromStdString(each.uuid));
  }
  const Workflow* const selected = studio_->selection().workflow();
  workflow_->setCurrentIndex(selected ? workflow_->findData(QString::fromStdString(selected->uuid)) : -1);
  workflow_->setPlaceholderText(studio_->catalogue().isLoading() ? words("Asking the server…") : words("No workflow"));
  workflow_->setEnabled(!studio_->isUnderWay() && workflow_->count() > 0);
}

} // namespace recorder
