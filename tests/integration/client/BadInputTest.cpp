#include "ClientTest.h"

#include <LumoraKit/platform/PropertyList.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::tests::contentOf;
using lumora::tests::FailedWith;
using lumora::tests::pair;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

namespace {

class BadInputTest : public lumora::tests::ClientTest {
protected:
  /// A tool that answers every request with the text.
  void answerWith(const std::string& reply) const {
    const auto answer = file("answer", reply);
    lumora::tests::writeFile(folder_ / "root/usr/bin/lumctl",
                             "#!/bin/sh\ncat > /dev/null\nexec cat '" + answer + "'\n");
  }
  std::string movie_ = file("lecture.mov");
};

TEST_F(BadInputTest, mistakesInTheCommandLine_areToldWithWhatIsNear) {
  const std::vector<std::pair<std::vector<std::string>, std::string>> mistakes{
      {{"workflow"}, "After \"workflow\" one of these words is needed: info, install, download, delete, submit."},
      {{"wrokflows"}, "There is no command \"wrokflows\"; the nearest is \"workflows\"."},
      {{"camera", "strat", "A"}, "There is no command \"camera strat\"; the nearest is \"start\"."},
      {{"camera", "start", "A", "--dealy", "1"}, "There is no option \"--dealy\"; the nearest is \"--delay\"."},
      {{"xyzzy"}, "There is no command \"xyzzy\"."},
      {{"info", "--delay", "1"}, "The command \"info\" takes no option \"--delay\"."},
      {{"info", "--quiet=yes"}, "The option \"--quiet\" takes no value."},
      {{"info", "--server"}, "The option \"--server\" needs a value: --server HOST[:PORT]."},
      {{"info", "-x"}, "There is no option \"-x\"."},
      {{"info", "more"}, "The command \"info\" does not take \"more\""},
      {{"camera", "start"}, "The command \"camera start\" needs CAMERA"},
      {{"camera", "start", "A", "--delay", "-1"}, "The value \"-1\" of \"--delay\" is not a whole number"},
      {{"camera", "start", "A", "--delay", "18446744073709551616"}, "is not a whole number"},
      {{"info", "--output", "xml"}, "The value \"xml\" of \"--output\" is none of text, plist, json."},
      {{"submit", movie_, "-w", "w", "--metadata", "=x"}, "is not of the form KEY=VALUE."},
      {{"submit", movie_, "-w", "w", "--recording-start", "yesterday"}, "is not a date like"},
      {{"submit", movie_, "-w", "w", "--recording-duration", "-1"}, "is not a number of seconds."},
      {{"config", "set", "Capture", ""}, "A setting needs a KEY"},
      {{"config", "set", "a=b", "c"}, "A setting needs a KEY"},
      {{"help", "xyzzy"}, "There is no command \"xyzzy\""},
  };
  for (const auto& [arguments, sentence] : mistakes) {
    EXPECT_THAT(run(arguments), FailedWith(64, sentence));
  }
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(BadInputTest, programExplainsItself_whenThereIsNoCommand) {
  const auto nothing = lumora::tests::runToEnd({LUMORA_CLIENT_PROGRAM});
  EXPECT_EQ(nothing.status, 64);
  EXPECT_EQ(nothing.standardOutput, "");
  EXPECT_THAT(nothing.standardError, StartsWith("usage: lumora COMMAND"));
}

TEST_F(BadInputTest, invalidUTF8_isRefusedBeforeTheToolIsRun) {
  EXPECT_THAT(run({"camera", "status", "Studio \xff"}), FailedWith(64, "is not valid UTF-8"));
  EXPECT_THAT(run({"submit", movie_, "-w", "single-video", "--title=\xc3"}), FailedWith(64, "is not valid UTF-8"));
  EXPECT_THAT(run({"login", "--password-file", file("bad", "\xff\xfe\n")}),
              FailedWith(65, "The password is not valid UTF-8."));
  ::setenv("LUMORA_USER", "\xff", 1);
  EXPECT_THAT(run({"workflows"}), FailedWith(64, "LUMORA_USER is not valid UTF-8."));
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(BadInputTest, controlCharacter_isRefusedBeforeTheToolIsRun) {
  EXPECT_THAT(run({"camera", "status", "a\x01z"}), FailedWith(11, "Invalid input: "));
  EXPECT_THAT(run({"submit", movie_, "-w", "single-video", "--title", "a\x01z"}),
              FailedWith(65, "The metadata cannot be sent: "));
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(BadInputTest, namesOfAnyKind_arriveAsTheyAre) {
  for (const std::string name : {"\"quoted\" & <tagged>", "two\nlines", "講義 🎥", "--not-an-option", " "}) {
    ASSERT_EQ(server_.administrate({"camera", "add"}, {"--", name}).status, 0) << name;
    EXPECT_EQ(reply({"camera", "status", "--", name}).string("name"), name);
    EXPECT_EQ(request(), Array{pair("status", name)});
    ASSERT_EQ(run({"submit", movie_, "-w", "single-video", "--title=" + name}).status, 0);
    EXPECT_EQ(server_.episodes().back().string("title"), name);
    requests();
  }
}

TEST_F(BadInputTest, controlCharactersOfTheServer_areShownAsEscapes) {
  answerWith(*lumora::xmlDescription(
      Dictionary{{"cameras", Array{Dictionary{{"name", "two\nlines\xC2\x9B and 講義 🎥"}, {"state", "idle"}},
                                   Dictionary{{"name", "plain"}, {"state", "idle"}}}}}));
  EXPECT_EQ(output({"cameras"}), "Name                        State\n"
                                 "two\\nlines\\x9b and 講義 🎥  idle\n"
                                 "plain                       idle\n");
  EXPECT_THAT(output({"cameras", "-ojson"}), HasSubstr(R"("two\nlines\u009b and 講義 🎥")"));
}

TEST_F(BadInputTest, longTexts_goBothWays) {
  const std::string text(std::size_t{1024} * 1024, 'x');
  const auto metadata = file("metadata", *lumora::xmlDescription(Dictionary{{"Title", text}}));
  ASSERT_EQ(run({"submit", movie_, "-w", "single-video", "--metadata-file", metadata}).status, 0);
  EXPECT_EQ(server_.episodes()[0].string("title"), text);
  answerWith(*lumora::xmlDescription(
      Dictionary{{"workflows", Array{Dictionary{{"name", "a"}, {"title", text}}, Dictionary{{"name", "b"}}}}}));
  EXPECT_EQ(output({"workflows"}), "Name  Title\na     " + text + "\nb\n");
}

TEST_F(BadInputTest, longestArgumentOfTheSystem_isSent) {
  const std::string text(std::size_t{120} * 1024, 'x');
  ASSERT_EQ(run({"submit", movie_, "-w", "single-video", "--title", text}).status, 0);
  EXPECT_EQ(server_.episodes()[0].string("title"), text);
}

TEST_F(BadInputTest, fileThatIsNotThere_isToldBeforeTheToolIsRun) {
  const auto missing = (folder_ / "missing").string();
  EXPECT_THAT(run({"submit", missing, "-w", "single-video"}),
              FailedWith(66, "\"" + missing + "\" cannot be read: No such"));
  EXPECT_THAT(run({"workflow", "install", missing}), FailedWith(66, "No such file or directory"));
  EXPECT_THAT(run({"workflow", "submit", "w", movie_, missing}), FailedWith(66, "No such file or directory"));
  EXPECT_THAT(run({"submit", movie_, "-w", "w", "--metadata-file", missing}), FailedWith(66, "No such file"));
  EXPECT_THAT(run({"login", "--password-file", missing}),
              FailedWith(66, "No password can be read from the file \"" + missing + "\": No such file"));
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(BadInputTest, fileThatMayNotBeRead_isToldBeforeTheToolIsRun) {
  if (getuid() == 0) {
    GTEST_SKIP() << "root may read everything";
  }
  std::filesystem::permissions(movie_, std::filesystem::perms::none);
  EXPECT_THAT(run({"submit", movie_, "-w", "single-video"}), FailedWith(66, "Permission denied"));
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(BadInputTest, passwordFile_mustHoldAPassword) {
  EXPECT_THAT(run({"login", "--password-file", file("empty", "")}), FailedWith(66, "its first line is empty"));
  EXPECT_THAT(run({"login", "--password-file", "/dev/zero"}), FailedWith(66, "its first line is too long"));
  EXPECT_THAT(run({"login", "--password-file", folder_.path().string()}), FailedWith(66, "Is a directory"));
  EXPECT_THAT(run({"login", "--password-file", "-"}), FailedWith(66, "from standard input: its first line is empty"));
}

TEST_F(BadInputTest, metadataFile_mustBeADictionary) {
  EXPECT_THAT(run({"submit", movie_, "-w", "w", "--metadata-file", movie_}),
              FailedWith(65, "is no property list with a dictionary"));
  EXPECT_THAT(run({"submit", movie_, "-w", "w", "--metadata-file", file("empty", "")}),
              FailedWith(65, "is no property list with a dictionary"));
  EXPECT_THAT(run({"submit", movie_, "-w", "w", "--metadata-file", folder_.path().string()}),
              FailedWith(66, "cannot be read: it is a folder."));
}

TEST_F(BadInputTest, fileThatCannotBeWritten_isToldBeforeTheToolIsRun) {
  server_.administrate({"camera", "add"}, {"A"});
  EXPECT_THAT(run({"camera", "preview", "A", "/nowhere/a.png"}),
              FailedWith(73, "\"/nowhere/a.png\" cannot be written: No such"));
  EXPECT_THAT(run({"camera", "preview", "A", folder_.path().string()}), FailedWith(73, "it is a folder"));
  EXPECT_THAT(run({"camera", "preview", "A", ""}), FailedWith(73, "cannot be written"));
  EXPECT_THAT(run({"workflow", "download", "w", "/proc/w.plist"}), FailedWith(73, "cannot be written"));
  EXPECT_THAT(run({"workflow", "download", "w", movie_ + "/w"}), FailedWith(73, "cannot be written"));
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(BadInputTest, pipe_getsTheFileAndStaysAPipe) {
  server_.administrate({"camera", "add"}, {"A"});
  const auto path = (folder_ / "pipe").string();
  ASSERT_EQ(mkfifo(path.c_str(), 0600), 0);
  // Held open for both, so that neither side waits for the other: the picture fits into the pipe.
  const int pipe = open(path.c_str(), O_RDWR | O_CLOEXEC | O_NONBLOCK);
  EXPECT_EQ(run({"camera", "preview", "A", path}).status, 0);
  std::string beginning(4, '\0');
  EXPECT_EQ(read(pipe, beginning.data(), beginning.size()), 4);
  EXPECT_EQ(beginning, "\x89PNG");
  close(pipe);
  EXPECT_TRUE(std::filesystem::is_fifo(path));
}

TEST_F(BadInputTest, linkStaysALink_whenItsTargetIsReplaced) {
  server_.administrate({"camera", "add"}, {"A"});
  std::filesystem::create_directories(folder_ / "out");
  std::filesystem::create_symlink(file("out/target", "old"), folder_ / "link");
  EXPECT_EQ(run({"camera", "preview", "A", (folder_ / "link").string()}).status, 0);
  EXPECT_TRUE(std::filesystem::is_symlink(folder_ / "link"));
  EXPECT_THAT(contentOf(folder_ / "out/target"), StartsWith("\x89PNG"));
  EXPECT_THAT(filesIn(folder_ / "out"), ElementsAre("target"));
}

TEST_F(BadInputTest, replyThatIsNone_isAnErrorOfItsOwn) {
  inject("garbage", {});
  EXPECT_THAT(run({"workflows"}), FailedWith(76, "The server carried the command out, but its reply cannot be read."));
  EXPECT_THAT(run({"workflows", "-ojson"}), FailedWith(76, "cannot be read"));
  EXPECT_EQ(output({"submit", movie_, "-w", "single-video"}), "Submitted " + movie_ + " to single-video.\n");
}

TEST_F(BadInputTest, fieldsOfAWrongType_arePrintedOrNamed) {
  answerWith(*lumora::xmlDescription(
      Dictionary{{"workflows", "many"}, {"name", 7}, {"sources", true}, {"ssl", Array{1, Dictionary{{"a", 2}}}}}));
  EXPECT_THAT(run({"workflows"}), FailedWith(76, "The server's reply holds no list of workflows."));
  EXPECT_EQ(reply({"workflows"}).string("workflows"), "many");
  EXPECT_EQ(output({"info"}), "SSL        [1, {a: 2}]\nworkflows  many\nname       7\nsources    yes\n");
  answerWith(*lumora::xmlDescription(Dictionary{{"cameras", Array{"A", 5, Dictionary{{"name", Array{}}}}}}));
  EXPECT_EQ(run({"cameras"}).status, 0);
  EXPECT_THAT(run({"camera", "preview", "A", (folder_ / "a").string()}), FailedWith(76, "no picture"));
}

} // namespace
