#pragma once

#include <filesystem>
#include <string_view>

namespace lumora::client {

/// A file that the program writes for the user: whole or not at all. The content goes into a temporary file beside it
/// and is moved into its place at the end; what was there before stays until then. A device or a pipe, and "-" for
/// standard output, gets the finished content written into it.
///
/// What cannot be done is a Failure.
class OutputFile {
public:
  /// Finds out at once whether the place can be written.
  explicit OutputFile(const std::filesystem::path& path);
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;
  /// Removes what was not committed.
  ~OutputFile();

  /// The absolute path of the file to fill; there is nothing yet.
  const std::filesystem::path& temporary() const { return temporary_; }
  void write(std::string_view content) const;
  void commit() const;

private:
  void replace() const;
  void copy() const;

  std::filesystem::path path_;
  bool isReplaced_ = true;
  std::filesystem::path folder_;
  std::filesystem::path temporary_;
};

/// Writes the whole text to standard output. A reader that went away ends the program without a word, as SIGPIPE does;
/// any other trouble is a Failure.
void writeToStandardOutput(std::string_view text);

} // namespace lumora::client
