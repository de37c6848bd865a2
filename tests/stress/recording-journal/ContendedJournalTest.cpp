#include "support/TemporaryFolder.h"

#include <LumoraKit/recording/LMRRecordingJournal.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include <sys/wait.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

constexpr int processes = 6;
constexpr int notes = 40;

pid_t inChild(const std::function<void()>& work) {
  const pid_t child = fork();
  if (child == 0) {
    work();
    _exit(EXIT_SUCCESS);
  }
  return child;
}

void expectEnds(const std::vector<pid_t>& children, const std::function<bool(int)>& isExpected) {
  for (const pid_t child : children) {
    int status = -1;
    EXPECT_EQ(waitpid(child, &status, 0), child);
    EXPECT_TRUE(isExpected(status)) << status;
  }
}

// Takes and closes what there is, and writes a line for each.
void closeAll(const std::filesystem::path& folder, const std::filesystem::path& report) {
  const auto journal = LMRRecordingJournal::journalWithFolder_error(folder, nullptr);
  std::string lines;
  for (int i = 0; i < notes; ++i) {
    for (const auto& note : journal->takeUnfinished()) {
      lines += journal->close(note.identifier) ? "refused\n" : note.identifier + "\n";
    }
  }
  writeFile(report, lines);
}

std::vector<std::string> linesOf(const std::string& text) {
  std::vector<std::string> lines;
  for (std::size_t begin = 0; begin < text.size();) {
    const auto end = text.find('\n', begin);
    lines.push_back(text.substr(begin, end - begin));
    begin = end + 1;
  }
  return lines;
}

TEST(ContendedJournal, givesEachNoteToOneProcess_andLeavesNothingBehind) {
  const TemporaryFolder temporary;
  const auto folder = temporary / "notes";
  std::vector<std::string> expected;
  {
    const auto journal = LMRRecordingJournal::journalWithFolder_error(folder, nullptr);
    for (int i = 0; i < notes; ++i) {
      LMRRecordingNote note;
      ASSERT_EQ(journal->open(note), nullptr);
      expected.push_back(note.identifier);
    }
  }
  std::vector<pid_t> children;
  children.reserve(processes);
  for (int i = 0; i < processes; ++i) {
    children.push_back(inChild([&, i] { closeAll(folder, temporary / std::to_string(i)); }));
  }
  expectEnds(children, [](int status) { return WIFEXITED(status) && WEXITSTATUS(status) == EXIT_SUCCESS; });
  std::vector<std::string> closed;
  for (int i = 0; i < processes; ++i) {
    const auto lines = linesOf(contentOf(temporary / std::to_string(i)));
    closed.insert(closed.end(), lines.begin(), lines.end());
  }
  std::ranges::sort(expected);
  std::ranges::sort(closed);
  EXPECT_EQ(closed, expected);
  EXPECT_TRUE(std::filesystem::is_empty(folder));
}

TEST(ContendedJournal, findsEveryNote_whenTheProcessesThatHadThemWereKilled) {
  const TemporaryFolder temporary;
  const auto folder = temporary / "notes";
  std::vector<pid_t> children;
  children.reserve(processes);
  for (int i = 0; i < processes; ++i) {
    children.push_back(inChild([&folder] {
      const auto journal = LMRRecordingJournal::journalWithFolder_error(folder, nullptr);
      for (int j = 0; j < notes / processes; ++j) {
        LMRRecordingNote note;
        journal->open(note);
      }
      journal->takeUnfinished();
      kill(getpid(), SIGKILL);
    }));
  }
  expectEnds(children, [](int status) { return WIFSIGNALED(status) && WTERMSIG(status) == SIGKILL; });
  const auto journal = LMRRecordingJournal::journalWithFolder_error(folder, nullptr);
  EXPECT_EQ(journal->takeUnfinished().size(), std::size_t{notes / processes} * processes);
}

} // namespace
} // namespace lumora::tests
