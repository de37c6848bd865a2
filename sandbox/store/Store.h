#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include <SQLiteCpp/SQLiteCpp.h>

namespace lumora::sandbox {

/// One server's state: a SQLite file and the folders of submitted files below ROOT/var/lib/lumora. Any number of
/// processes open the same one at once; each change is one short transaction. Failures are thrown
/// (SQLite::Exception, std::filesystem::filesystem_error).
class Store {
public:
  /// Makes an empty server; refuses a root that holds one already.
  static Store create(const std::filesystem::path& root);
  static Store open(const std::filesystem::path& root);
  static bool existsAt(const std::filesystem::path& root);

  const std::filesystem::path& root() const { return root_; }
  /// Where everything lies that the server knows, for its owner alone.
  std::filesystem::path stateFolder() const;
  /// Where filed submissions lie, one folder each.
  std::filesystem::path submissionsFolder() const;
  /// Where files are copied to before they are filed.
  std::filesystem::path incomingFolder() const;
  /// Where the cameras' preview images lie.
  std::filesystem::path previewsFolder() const;

  SQLite::Database& database() { return *database_; }

  /// Runs one statement that returns no rows; the number of rows it changed.
  template <class... Values> int execute(const char* sql, const Values&... values) {
    SQLite::Statement statement(*database_, sql);
    bind(statement, values...);
    return statement.exec();
  }
  /// A statement with its values bound, ready to step through.
  template <class... Values> SQLite::Statement query(const char* sql, const Values&... values) {
    SQLite::Statement statement(*database_, sql);
    bind(statement, values...);
    return statement;
  }
  /// Runs the change as one transaction that excludes every other writer; undone when the change throws.
  void change(const std::function<void()>& change);

  std::optional<std::string> setting(const std::string& key);
  std::string setting(const std::string& key, const std::string& otherwise);
  void setSetting(const std::string& key, const std::string& value);

  /// Closes and reopens the database around a fork(2): a connection must not be carried into a child.
  void suspend() { database_.reset(); }
  void resume();

private:
  explicit Store(std::filesystem::path root);

  template <class... Values> static void bind(SQLite::Statement& statement, const Values&... values) {
    int index = 0;
    (bindOne(statement, ++index, values), ...);
  }
  static void bindOne(SQLite::Statement& statement, int index, const std::string& text) { statement.bind(index, text); }
  static void bindOne(SQLite::Statement& statement, int index, std::int64_t number) { statement.bind(index, number); }
  template <class Content>
  static void bindOne(SQLite::Statement& statement, int index, const std::optional<Content>& content) {
    // What is not bound is NULL.
    if (content) {
      statement.bind(index, *content);
    }
  }

  std::filesystem::path root_;
  std::unique_ptr<SQLite::Database> database_;
};

/// The column's content; nothing for NULL.
std::optional<std::string> optionalText(const SQLite::Column& column);
std::optional<std::int64_t> optionalNumber(const SQLite::Column& column);

/// Seconds since 1970, as the state keeps moments.
std::int64_t currentTime();
/// The same in milliseconds, as cameras need it.
std::int64_t currentMilliseconds();

} // namespace lumora::sandbox
