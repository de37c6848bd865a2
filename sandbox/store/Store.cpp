#include "Store.h"

#include <sqlite3.h>

#include <cerrno>
#include <chrono>
#include <ctime>
#include <stdexcept>
#include <thread>

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

namespace lumora::sandbox {

namespace fs = std::filesystem;

namespace {

constexpr std::chrono::milliseconds busyTimeout{60'000};
constexpr int schemaVersion = 3;

constexpr const char* schema = R"sql(
CREATE TABLE settings (key TEXT PRIMARY KEY, value TEXT NOT NULL);
CREATE TABLE users (
  name TEXT PRIMARY KEY, full_name TEXT NOT NULL, password_hash TEXT NOT NULL);
CREATE TABLE principals (principal TEXT PRIMARY KEY, user TEXT NOT NULL);
CREATE TABLE workflows (
  uuid TEXT PRIMARY KEY, name TEXT NOT NULL UNIQUE, title TEXT NOT NULL, sources TEXT NOT NULL,
  is_protected INTEGER NOT NULL, added INTEGER NOT NULL);
CREATE TABLE recordings (
  uuid TEXT PRIMARY KEY, workflow_uuid TEXT NOT NULL, workflow_name TEXT NOT NULL, user TEXT NOT NULL,
  created INTEGER NOT NULL);
CREATE TABLE slots (
  uuid TEXT PRIMARY KEY, recording_uuid TEXT NOT NULL REFERENCES recordings, position INTEGER NOT NULL);
CREATE TABLE episodes (
  uuid TEXT PRIMARY KEY, slot_uuid TEXT UNIQUE REFERENCES slots, workflow_uuid TEXT NOT NULL,
  workflow_name TEXT NOT NULL, user TEXT NOT NULL, submitted INTEGER NOT NULL, user_metadata TEXT NOT NULL,
  recording_metadata TEXT);
CREATE TABLE files (
  episode_uuid TEXT NOT NULL REFERENCES episodes, position INTEGER NOT NULL, name TEXT NOT NULL,
  stored_name TEXT NOT NULL, size INTEGER NOT NULL, sha256 TEXT NOT NULL, PRIMARY KEY (episode_uuid, position));
CREATE TABLE uploads (
  uuid TEXT PRIMARY KEY, title TEXT NOT NULL, workflow_name TEXT NOT NULL, user TEXT NOT NULL, file_count INTEGER NOT NULL,
  size INTEGER NOT NULL, state TEXT NOT NULL, message TEXT, started INTEGER NOT NULL, ended INTEGER);
CREATE TABLE cameras (
  name TEXT PRIMARY KEY, uuid TEXT NOT NULL, is_bound INTEGER NOT NULL, take TEXT, user TEXT, audio_only INTEGER,
  begins INTEGER, since INTEGER, recorded INTEGER);
CREATE TABLE configuration (key TEXT PRIMARY KEY, value TEXT NOT NULL);
CREATE TABLE faults (
  id INTEGER PRIMARY KEY AUTOINCREMENT, command TEXT NOT NULL, kind TEXT NOT NULL, value INTEGER NOT NULL,
  message TEXT, remaining INTEGER);
)sql";

fs::path stateFolderBelow(const fs::path& root) {
  return root / "var" / "lib" / "lumora";
}

fs::path databasePath(const fs::path& root) {
  return stateFolderBelow(root) / "server.sqlite";
}

/// A change takes a fraction of a millisecond; SQLite's own handler would soon wait a tenth of a second for one.
int waitWhileBusy(void*, int count) {
  constexpr std::chrono::microseconds pause{500};
  std::this_thread::sleep_for(pause);
  return count < busyTimeout / pause ? 1 : 0;
}

std::unique_ptr<SQLite::Database> openDatabase(const fs::path& root, int flags) {
  auto database = std::make_unique<SQLite::Database>(databasePath(root).string(), flags);
  sqlite3_busy_handler(database->getHandle(), waitWhileBusy, nullptr);
  // A killed process loses nothing in this mode; only a power cut may lose the last transactions.
  database->exec("PRAGMA synchronous = NORMAL; PRAGMA foreign_keys = ON; PRAGMA wal_autocheckpoint = 200");
  // Nearly every tool is the last one to close: none shall wait for the disk because of that.
  sqlite3_db_config(database->getHandle(), SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 1, nullptr);
  return database;
}

/// The right to change, for one process at a time. The kernel wakes whoever waits: dozens of processes that ask SQLite
/// for its lock again and again would cost more than all that they do.
class Turn {
public:
  explicit Turn(const fs::path& folder) : lock_(open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)) {
    while (flock(lock_, LOCK_EX) != 0 && errno == EINTR) {
    }
  }
  Turn(const Turn&) = delete;
  Turn& operator=(const Turn&) = delete;
  ~Turn() { close(lock_); }

private:
  int lock_;
};

} // namespace

Store::Store(fs::path root) : root_(std::move(root)) {}

bool Store::existsAt(const fs::path& root) {
  std::error_code ignored;
  return fs::is_regular_file(databasePath(root), ignored);
}

Store Store::create(const fs::path& root) {
  if (existsAt(root)) {
    throw std::runtime_error("there is a server at " + root.string() + " already");
  }
  Store store(fs::absolute(root));
  fs::create_directories(store.submissionsFolder());
  fs::create_directories(store.incomingFolder());
  fs::create_directories(store.previewsFolder());
  fs::permissions(store.stateFolder(), fs::perms::owner_all);
  store.database_ = openDatabase(store.root_, SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE);
  store.database_->exec("PRAGMA journal_mode = WAL");
  store.change([&] {
    store.database_->exec(schema);
    store.database_->exec("PRAGMA user_version = " + std::to_string(schemaVersion));
  });
  return store;
}

Store Store::open(const fs::path& root) {
  if (!existsAt(root)) {
    throw std::runtime_error("there is no server at " + root.string());
  }
  Store store(fs::absolute(root));
  store.resume();
  const int version = store.database_->execAndGet("PRAGMA user_version").getInt();
  if (version != schemaVersion) {
    throw std::runtime_error("the server at " + root.string() + " is of another version (" + std::to_string(version) +
                             ", not " + std::to_string(schemaVersion) + ")");
  }
  return store;
}

void Store::resume() {
  database_ = openDatabase(root_, SQLite::OPEN_READWRITE);
}

fs::path Store::stateFolder() const {
  return stateFolderBelow(root_);
}

fs::path Store::submissionsFolder() const {
  return stateFolder() / "submissions";
}

fs::path Store::incomingFolder() const {
  return stateFolder() / "incoming";
}

fs::path Store::previewsFolder() const {
  return stateFolder() / "previews";
}

void Store::change(const std::function<void()>& change) {
  const Turn turn(stateFolder());
  // Immediate: a transaction that reads first and writes later could not wait for another writer.
  SQLite::Transaction transaction(*database_, SQLite::TransactionBehavior::IMMEDIATE);
  change();
  transaction.commit();
}

std::optional<std::string> Store::setting(const std::string& key) {
  auto row = query("SELECT value FROM settings WHERE key = ?", key);
  return row.executeStep() ? std::optional(row.getColumn(0).getString()) : std::nullopt;
}

std::string Store::setting(const std::string& key, const std::string& otherwise) {
  return setting(key).value_or(otherwise);
}

void Store::setSetting(const std::string& key, const std::string& value) {
  execute("INSERT INTO settings VALUES (?, ?) ON CONFLICT (key) DO UPDATE SET value = excluded.value", key, value);
}

std::optional<std::string> optionalText(const SQLite::Column& column) {
  return column.isNull() ? std::nullopt : std::optional(column.getString());
}

std::optional<std::int64_t> optionalNumber(const SQLite::Column& column) {
  return column.isNull() ? std::nullopt : std::optional<std::int64_t>(column.getInt64());
}

std::int64_t currentTime() {
  return std::time(nullptr);
}

std::int64_t currentMilliseconds() {
  using namespace std::chrono;
  return duration_cast<milliseconds>(system_clock::now().time_since_epoch()).count();
}

} // namespace lumora::sandbox
