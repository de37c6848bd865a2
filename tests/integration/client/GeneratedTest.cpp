// What is made from the table of commands, tried with the programs that it is for.
#include "ClientTest.h"

#include <client/grammar/Command.h>

using lumora::tests::ClientProcess;
using lumora::tests::contentOf;
using lumora::tests::runToEnd;
using testing::HasSubstr;

namespace {

constexpr const char* manualPage = LUMORA_CLIENT_FOLDER "/lumora.1";
constexpr const char* bashFile = LUMORA_CLIENT_FOLDER "/bash/lumora";
constexpr const char* zshFolder = LUMORA_CLIENT_FOLDER "/zsh";

bool isInstalled(const std::string& program) {
  return runToEnd({"/bin/sh", "-c", "command -v " + program}).status == 0;
}

TEST(ManualPage, holdsEveryCommandAndOption) {
  std::string text = contentOf(manualPage);
  std::erase(text, '\\');
  for (const auto& command : lumora::client::allCommands()) {
    EXPECT_THAT(text, HasSubstr(".SS " + std::string(command.words) + " "));
    for (const auto& option : command.options) {
      EXPECT_THAT(text, HasSubstr("fB" + std::string(option.name) + "fR"));
    }
  }
}

TEST(ManualPage, isRenderedWithoutAWarning) {
  if (!isInstalled("man")) {
    GTEST_SKIP() << "there is no man";
  }
  const auto page =
      runToEnd({"/bin/sh", "-c", "LC_ALL=C.UTF-8 MANWIDTH=80 man --warnings -l " + std::string(manualPage)});
  EXPECT_EQ(page.status, 0);
  EXPECT_EQ(page.standardError, "");
  EXPECT_THAT(page.standardOutput, HasSubstr("lumora - run an operation of a Lumora server"));
}

TEST(ManualPage, passesTheLinter) {
  if (!isInstalled("mandoc")) {
    GTEST_SKIP() << "there is no mandoc";
  }
  EXPECT_EQ(runToEnd({"mandoc", "-Tlint", manualPage}).standardOutput, "");
}

TEST(Help, isThereForEveryCommand) {
  for (const auto& command : lumora::client::allCommands()) {
    const auto words = std::string(command.words);
    const auto blank = words.find(' ');
    std::vector<std::string> line{LUMORA_CLIENT_PROGRAM, "help", words.substr(0, blank)};
    if (blank != std::string::npos) {
      line.push_back(words.substr(blank + 1));
    }
    const auto result = runToEnd(line);
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(result.standardOutput, testing::StartsWith("usage: lumora " + words));
    line.erase(line.begin() + 1);
    line.emplace_back("--help");
    EXPECT_EQ(runToEnd(line).standardOutput, result.standardOutput);
  }
}

TEST(Help, tellsTheVersion) {
  EXPECT_THAT(runToEnd({LUMORA_CLIENT_PROGRAM, "--version"}).standardOutput, testing::StartsWith("lumora "));
}

/// A shell on a terminal, in a folder with a file, that knows the completion.
class CompletionTest : public testing::TestWithParam<const char*> {
protected:
  CompletionTest() {
    lumora::tests::writeFile(folder_ / "lecture.mov", "");
    std::filesystem::create_directory(folder_ / "recordings");
  }
  void SetUp() override {
    if (!isInstalled(GetParam())) {
      GTEST_SKIP() << "there is no " << GetParam();
    }
    ::setenv("TERM", "dumb", 1);
    const bool isBash = std::string(GetParam()) == "bash";
    const auto arguments = isBash ? std::vector<std::string>{"bash", "--norc", "--noprofile", "-i"}
                                  : std::vector<std::string>{"zsh", "-f", "-i"};
    shell_ = std::make_unique<ClientProcess>(arguments, ClientProcess::Terminal::Everywhere);
    const auto preparation = isBash ? "source " + std::string(bashFile) + "; bind 'set enable-bracketed-paste off'"
                                    : "unsetopt zle_bracketed_paste; fpath=(" + std::string(zshFolder) +
                                          " $fpath); autoload -Uz compinit; compinit -u -D";
    // Written in two halves, so that the echo of the line is not taken for its end.
    shell_->type("PS1='$ '; cd " + folder_.path().string() + "; lumora() { printf '<%s>' \"$@\"; echo; }; " +
                 preparation + "; echo rea''dy\n");
    EXPECT_THAT(shell_->readUntil("ready\r\n"), HasSubstr("ready"));
  }

  /// What the shell makes of the words when the tabulator is pressed behind them, as the arguments that the program
  /// would get.
  std::string completed(const std::string& words) {
    shell_->type("lumora " + words + "\t\necho do''ne\n");
    const auto text = shell_->readUntil("done\r\n");
    const auto start = text.find('<');
    return start == std::string::npos ? text : text.substr(start, text.find_first_of("\r\n", start) - start);
  }

  lumora::tests::TemporaryFolder folder_;
  std::unique_ptr<ClientProcess> shell_;
};

TEST_P(CompletionTest, completesCommands) {
  EXPECT_EQ(completed("workflows"), "<workflows>");
  EXPECT_EQ(completed("tra"), "<transfers>");
  EXPECT_EQ(completed("camera prev"), "<camera><preview>");
  EXPECT_EQ(completed("transfers cl"), "<transfers><clear>");
  EXPECT_EQ(completed("help camera canc"), "<help><camera><cancel>");
  EXPECT_EQ(completed("--quiet camera sto"), "<--quiet><camera><stop>");
}

TEST_P(CompletionTest, completesOptions) {
  EXPECT_EQ(completed("camera start A --del"), "<camera><start><A><--delay>");
  EXPECT_EQ(completed("submit --asy"), "<submit><--async>");
  EXPECT_EQ(completed("info --ser"), "<info><--server>");
  // Of a command that does not take it.
  EXPECT_EQ(completed("transfers --ser"), "<transfers><--ser>");
}

TEST_P(CompletionTest, completesValues) {
  EXPECT_EQ(completed("cameras --output js"), "<cameras><--output><json>");
  EXPECT_EQ(completed("cameras -o pl"), "<cameras><-o><plist>");
  EXPECT_EQ(completed("cameras --output=js"), "<cameras><--output=json>");
  EXPECT_EQ(completed("config set Recording"), "<config><set><Recording>");
  EXPECT_EQ(completed("config set RecordingV"), "<config><set><RecordingVideoInput>");
  EXPECT_EQ(completed("config get Capt"), "<config><get><Capture>");
}

TEST_P(CompletionTest, completesFiles) {
  EXPECT_EQ(completed("submit lect"), "<submit><lecture.mov>");
  EXPECT_EQ(completed("submit -w w lecture.mov lect"), "<submit><-w><w><lecture.mov><lecture.mov>");
  EXPECT_EQ(completed("workflow install lect"), "<workflow><install><lecture.mov>");
  EXPECT_EQ(completed("workflow download W lect"), "<workflow><download><W><lecture.mov>");
  EXPECT_EQ(completed("cameras --password-file lect"), "<cameras><--password-file><lecture.mov>");
  // zsh takes the slash back when the line ends there.
  EXPECT_THAT(completed("cameras --root rec"), testing::StartsWith("<cameras><--root><recordings"));
}

INSTANTIATE_TEST_SUITE_P(In, CompletionTest, testing::Values("bash", "zsh"),
                         [](const auto& shell) { return std::string(shell.param); });

} // namespace
