#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <map>
#include <set>

#include <client/Failure.h>
#include <client/grammar/CommandLine.h>
#include <client/grammar/NearestWord.h>
#include <client/grammar/Values.h>

using lumora::client::CommandLine;
using lumora::client::Failure;
using lumora::client::Kind;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

CommandLine parse(const std::vector<std::string>& arguments) {
  return CommandLine::parse(arguments);
}

std::string complaintAbout(const std::vector<std::string>& arguments) {
  try {
    parse(arguments);
    return "";
  } catch (const Failure& failure) {
    EXPECT_EQ(failure.status(), 64);
    return failure.what();
  }
}

TEST(CommandLineTest, findsTheCommand_byItsOneOrTwoWords) {
  EXPECT_EQ(parse({"info"}).command()->words, "info");
  EXPECT_EQ(parse({"camera", "pause", "A"}).command()->words, "camera pause");
  EXPECT_EQ(parse({"transfers"}).command()->words, "transfers");
  EXPECT_EQ(parse({"transfers", "clear"}).command()->words, "transfers clear");
}

TEST(CommandLineTest, takesOptionsAnywhere) {
  const auto line = parse({"-q", "camera", "--delay", "5", "start", "--audio-only", "A", "--output=json"});
  EXPECT_EQ(line.command()->words, "camera start");
  EXPECT_EQ(line.operand("CAMERA"), "A");
  EXPECT_EQ(line.value("--delay"), "5");
  EXPECT_EQ(line.value("--output"), "json");
  EXPECT_TRUE(line.has("--audio-only"));
  EXPECT_TRUE(line.has("--quiet"));
  EXPECT_FALSE(line.has("--progress"));
  EXPECT_EQ(line.value("--progress"), std::nullopt);
}

TEST(CommandLineTest, takesLettersTogether) {
  const auto line = parse({"info", "-qojson", "-shost"});
  EXPECT_TRUE(line.has("--quiet"));
  EXPECT_EQ(line.value("--output"), "json");
  EXPECT_EQ(line.value("--server"), "host");
  EXPECT_EQ(parse({"info", "-qo", "plist"}).value("--output"), "plist");
}

TEST(CommandLineTest, endsOptionsAtTwoDashes) {
  EXPECT_EQ(parse({"camera", "pause", "--", "--quiet"}).operand("CAMERA"), "--quiet");
  EXPECT_EQ(parse({"workflow", "download", "w", "-"}).operand("FILE"), "-");
}

TEST(CommandLineTest, collectsValues_whereTheyRepeat) {
  const auto line = parse({"submit", "a", "b", "-w", "x", "-w", "y", "--metadata", "k=1", "--metadata=l=2"});
  EXPECT_THAT(line.operands("FILE"), ElementsAre("a", "b"));
  EXPECT_THAT(line.values("--metadata"), ElementsAre("k=1", "l=2"));
  EXPECT_EQ(line.value("--workflow"), "y");
}

TEST(CommandLineTest, takesEmptyValues) {
  EXPECT_EQ(parse({"submit", "a", "--workflow="}).value("--workflow"), "");
  EXPECT_EQ(parse({"camera", "pause", ""}).operand("CAMERA"), "");
}

TEST(CommandLineTest, leavesOptionalOperandsOut) {
  EXPECT_THAT(parse({"config", "get"}).operands("KEY"), IsEmpty());
  EXPECT_THAT(parse({"config", "get", "Capture"}).operands("KEY"), ElementsAre("Capture"));
}

TEST(CommandLineTest, hasNoCommand_whenHelpOrVersionIsAskedFor) {
  for (const auto& arguments : std::vector<std::vector<std::string>>{
           {"help"}, {"camera", "--help"}, {"-h"}, {"--version"}, {"help", "camera"}}) {
    EXPECT_EQ(parse(arguments).command(), nullptr);
  }
}

TEST(CommandLineTest, refusesWithASentence) {
  EXPECT_EQ(complaintAbout({}), "A command is needed.");
  EXPECT_EQ(complaintAbout({"submit", "a"}), "The command \"submit\" needs --workflow WORKFLOW or --submission UUID.");
  EXPECT_THAT(complaintAbout({"camera", "pause", "A\nB", "C\x1b"}), HasSubstr("does not take \"C\\x1b\""));
  EXPECT_EQ(complaintAbout({"info", "--output"}), "The option \"--output\" needs a value: --output FORM.");
}

TEST(CommandTableTest, optionsOfOneNameAreAlike) {
  std::map<std::string_view, bool> takesValue;
  std::map<char, std::string_view> letters;
  const auto check = [&](std::span<const lumora::client::Option> options) {
    for (const auto& option : options) {
      const bool takes = option.kind != Kind::Flag;
      EXPECT_EQ(takesValue.emplace(option.name, takes).first->second, takes) << option.name;
      EXPECT_EQ(takes, !option.value.empty()) << option.name;
      if (option.letter != '\0') {
        EXPECT_EQ(letters.emplace(option.letter, option.name).first->second, option.name);
      }
      EXPECT_FALSE(option.help.empty() || option.help.ends_with('.')) << option.name;
    }
  };
  check(lumora::client::commonOptions());
  for (const auto& command : lumora::client::allCommands()) {
    check(command.options);
  }
}

TEST(CommandTableTest, noOptionTakesASecret) {
  const std::set<std::string_view> allowed{"--password-file", "--master-password-file", "--ask-master-password"};
  for (const auto& command : lumora::client::allCommands()) {
    for (const auto& option : command.options) {
      EXPECT_TRUE(option.name.find("password") == std::string_view::npos || allowed.contains(option.name));
    }
  }
}

TEST(CommandTableTest, namesAreUnique) {
  std::set<std::string_view> names;
  for (const auto& command : lumora::client::allCommands()) {
    EXPECT_TRUE(names.insert(command.words).second) << command.words;
    EXPECT_NE(command.run, nullptr);
    EXPECT_NE(command.text, nullptr);
  }
}

TEST(NearestWordTest, isTheOneThatWasMeant) {
  using lumora::client::nearestWord;
  EXPECT_EQ(nearestWord("strat", {"stop", "start", "status"}), "start");
  EXPECT_EQ(nearestWord("cameas", {"camera", "cameras"}), "cameras");
  EXPECT_EQ(nearestWord("xyzzy", {"stop", "start"}), "");
  EXPECT_EQ(nearestWord("", {"stop"}), "");
  EXPECT_EQ(nearestWord(std::string(1000000, 'x'), {"stop"}), "");
}

TEST(ValuesTest, numbersAreWholeAndFit) {
  using lumora::client::number;
  EXPECT_EQ(number("18446744073709551615"), UINT64_MAX);
  for (const auto* text : {"", "-1", "+1", " 1", "1 ", "0x1", "1.0", "18446744073709551616"}) {
    EXPECT_EQ(number(text), std::nullopt) << text;
  }
}

TEST(ValuesTest, secondsMayHaveAFraction) {
  using lumora::client::seconds;
  EXPECT_EQ(seconds("1.5"), 1.5);
  for (const auto* text : {"", "-1", "nan", "inf", "1e3", "1s"}) {
    EXPECT_EQ(seconds(text), std::nullopt) << text;
  }
}

TEST(ValuesTest, datesTellTheirDistanceToUTC) {
  using lumora::client::date;
  EXPECT_EQ(date("1970-01-01T01:00:30+01:00"), lumora::Date(std::chrono::seconds(30)));
  EXPECT_EQ(date("1970-01-01T00:00:30Z"), lumora::Date(std::chrono::seconds(30)));
  for (const auto* text : {"", "1970-01-01", "1970-01-01T00:00:30", "1970-13-01T00:00:30Z", "now"}) {
    EXPECT_EQ(date(text), std::nullopt) << text;
  }
}

} // namespace
