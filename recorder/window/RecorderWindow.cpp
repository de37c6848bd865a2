#include "recorder/window/RecorderWindow.h"

#include "recorder/window/SettingsDialog.h"
#include "recorder/window/Words.h"

#include <QAction>
#include <QMenuBar>
#include <QVBoxLayout>
#include <chrono>
#include <utility>

namespace recorder {
namespace {

constexpr std::chrono::milliseconds interval{66};
constexpr int margin = 16;
constexpr int sidebarCharacters = 38;

} // namespace

RecorderWindow::RecorderWindow()
    : studio_(Studio::make()),
      login_(std::make_shared<LoginFlow>([this](const std::shared_ptr<LMRSession>& session) { loggedIn(session); })),
      pages_(new QStackedWidget(this)) {
  setWindowTitle("Lumora Recorder");
  pages_->addWidget(buildWelcome());
  pages_->addWidget(buildRecorder());
  setCentralWidget(pages_);
  buildMenus();
  resize(fontMetrics().averageCharWidth() * 160, fontMetrics().height() * 38);
  connection_ = studio_->changed.observe([this] { isRefreshWanted_ = true; });
  connect(&timer_, &QTimer::timeout, this, [this] { tick(); });
  timer_.start(interval);
  studio_->begin();
  refresh();
}

RecorderWindow::~RecorderWindow() = default;

QWidget* RecorderWindow::buildWelcome() {
  auto* const page = new QWidget(this);
  auto* const text = new QLabel(words("Log in to a Lumora server to record."), page);
  auto* const button = new QPushButton(words("Log In…"), page);
  button->setObjectName("logIn");
  button->setAutoDefault(true);
  connect(button, &QPushButton::clicked, this, [this] { logIn(); });
  auto* const layout = new QVBoxLayout(page);
  layout->addStretch(3);
  layout->addWidget(text, 0, Qt::AlignCenter);
  layout->addWidget(button, 0, Qt::AlignCenter);
  layout->addStretch(1);
  return page;
}

QWidget* RecorderWindow::buildRecorder() {
  auto* const page = new QWidget(this);
  notice_ = new NoticeBar(page);
  empty_ = new QLabel(page);
  empty_->setAlignment(Qt::AlignCenter);
  empty_->setWordWrap(true);
  controls_ = new ControlBar(studio_, page);
  connect(notice_, &NoticeBar::dismissed, this, [this] { studio_->dismissNotice(); });
  connect(controls_, &ControlBar::stopWanted, this, [this] { stop(); });
  connect(controls_, &ControlBar::cancelWanted, this, [this] { askToDiscard(); });
  cardRow_ = new QHBoxLayout;
  cardRow_->setSpacing(margin);
  auto* const stage = new QVBoxLayout;
  stage->setSpacing(margin);
  stage->addWidget(notice_);
  stage->addWidget(empty_, 1);
  stage->addLayout(cardRow_, 1);
  stage->addWidget(controls_);
  auto* const layout = new QHBoxLayout(page);
  layout->setContentsMargins(margin, margin, margin, margin);
  layout->setSpacing(margin * 3 / 2);
  layout->addLayout(stage, 1);
  layout->addWidget(buildSidebar());
  return page;
}

QWidget* RecorderWindow::buildSidebar() {
  auto* const sidebar = new QWidget(this);
  sidebar->setFixedWidth(fontMetrics().averageCharWidth() * sidebarCharacters);
  episode_ = new EpisodePanel(studio_, sidebar);
  submissions_ = new SubmissionList(studio_, sidebar);
  user_ = new QLabel(sidebar);
  user_->setWordWrap(true);
  user_->setForegroundRole(QPalette::PlaceholderText);
  auto* const layout = new QVBoxLayout(sidebar);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->setSpacing(margin);
  layout->addWidget(episode_);
  layout->addWidget(submissions_, 1);
  layout->addWidget(user_);
  return sidebar;
}

void RecorderWindow::buildMenus() {
  const auto add = [this](QMenu* menu, Text label, const QKeySequence& keys, auto&& what) {
    auto* const action = menu->addAction(words(label));
    action->setShortcut(keys);
    connect(action, &QAction::triggered, this, what);
    return action;
  };
  QMenu* const application = menuBar()->addMenu(words("&Application"));
  loginAction_ = add(application, "&Log In…", QKeySequence("Ctrl+L"), [this] { logIn(); });
  settingsAction_ = add(application, "&Settings…", QKeySequence("Ctrl+,"), [this] { showSettings(); });
  application->addSeparator();
  add(application, "&Quit", QKeySequence("Ctrl+Q"), [this] { close(); });
  QMenu* const recording = menuBar()->addMenu(words("&Recording"));
  recordAction_ = add(recording, "&Record", QKeySequence("Ctrl+R"), [this] { studio_->record(); });
  pauseAction_ = add(recording, "&Pause or Resume", QKeySequence("Ctrl+P"), [this] {
    const auto take = studio_->take();
    take->state() == TakeState::Paused ? take->resume() : take->pause();
  });
  stopAction_ = add(recording, "&Stop and Submit", QKeySequence("Ctrl+S"), [this] { stop(); });
  discardAction_ = add(recording, "&Discard…", QKeySequence("Ctrl+D"), [this] { askToDiscard(); });
}

void RecorderWindow::logIn() {
  if (!studio_->isUnderWay()) {
    login_->begin(this);
  }
}

void RecorderWindow::loggedIn(const std::shared_ptr<LMRSession>& session) {
  if (session) {
    studio_->setSession(session);
    pages_->setCurrentIndex(1);
    const std::string user = session->userFullName().value_or(session->userName().value_or(""));
    user_->setText(words("%1 at %2").arg(QString::fromStdString(user), QString::fromStdString(session->description())));
  }
}

// The rest of the window follows the studio: at most once a tick, however much has changed.
void RecorderWindow::tick() {
  const bool isSeen = isVisible() && !isMinimized();
  Studio::PictureSize size;
  for (const SourceCard* const card : cards_) {
    const QSize wanted = card->pictureSize();
    if (isSeen && (!size || static_cast<std::uint32_t>(wanted.width()) > size->first)) {
      size = {static_cast<std::uint32_t>(wanted.width()), static_cast<std::uint32_t>(wanted.height())};
    }
  }
  studio_->tick(size);
  if (std::exchange(isRefreshWanted_, false)) {
    refresh();
  }
  for (SourceCard* const card : cards_) {
    card->showNow();
  }
  controls_->showNow();
}

void RecorderWindow::refresh() {
  refreshCards();
  notice_->setText(QString::fromStdString(studio_->notice()));
  empty_->setText(emptyText());
  empty_->setVisible(cards_.empty());
  controls_->refresh();
  episode_->refresh();
  submissions_->refresh();
  refreshMenus();
  if (std::exchange(wasUnderWay_, studio_->isUnderWay()) && !studio_->isUnderWay()) {
    episode_->clear();
  }
  if (studio_->take() && studio_->take()->hasNoPlaceAtServer() && !isAskingAboutServer_) {
    askToStopWithoutServer();
  }
  if (studio_->recovery().found() && !studio_->recovery().isBusy() && !isAskingAboutInterrupted_) {
    askAboutInterrupted();
  }
  closeWhenDone();
}

void RecorderWindow::refreshCards() {
  const std::size_t wanted = studio_->sources().size();
  while (cards_.size() > wanted) {
    cards_.back()->deleteLater();
    cards_.pop_back();
  }
  while (cards_.size() < wanted) {
    cards_.push_back(new SourceCard(studio_, cards_.size(), this));
    cardRow_->addWidget(cards_.back(), 1);
  }
  for (SourceCard* const card : cards_) {
    card->refresh();
  }
}

QString RecorderWindow::emptyText() const {
  const ServerCatalogue& catalogue = studio_->catalogue();
  if (catalogue.isLoading() || !studio_->devices().isKnown()) {
    return words("Looking for cameras and workflows…");
  }
  if (catalogue.error()) {
    return words("The server did not list its workflows: %1")
        .arg(QString::fromStdString(catalogue.error()->localizedDescription()));
  }
  return words("No workflow of this server can be recorded with what is connected to this computer.");
}

void RecorderWindow::refreshMenus() {
  const auto& take = studio_->take();
  const bool isSettled = take && (take->state() == TakeState::Recording || take->state() == TakeState::Paused);
  loginAction_->setEnabled(!studio_->isUnderWay());
  settingsAction_->setEnabled(studio_->session() && !studio_->isUnderWay());
  recordAction_->setEnabled(studio_->canRecord());
  for (QAction* const action : {pauseAction_, stopAction_, discardAction_}) {
    action->setEnabled(isSettled);
  }
}

void RecorderWindow::showSettings() {
  SettingsDialog dialog(*studio_, this);
  if (dialog.exec() == QDialog::Accepted && dialog.settings() != studio_->settings()) {
    studio_->setSettings(dialog.settings());
  }
}

} // namespace recorder
