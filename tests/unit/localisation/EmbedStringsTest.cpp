#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/KTRunTask.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <string>

using testing::HasSubstr;

namespace {

/// Runs the build's own compiler of strings tables on a table.
class EmbedStringsTest : public testing::Test {
protected:
  EmbedStringsTest() { std::filesystem::create_directory(folder_ / "xx.lproj"); }

  /// The exit status; the messages are in errors_.
  int compile(const std::string& table) {
    const auto path = folder_ / "xx.lproj" / "Localizable.strings";
    lumora::tests::writeFile(path, table);
    return KTRunTask(LUMORA_EMBED_STRINGS, {output(), path.string()}, "", nullptr, &errors_, nullptr);
  }

  std::string output() const { return (folder_ / "Tables.cpp").string(); }
  std::string source() const { return lumora::tests::contentOf(output()); }

  void expectRefused(const std::string& table, const std::string& reason) {
    EXPECT_EQ(compile(table), EXIT_FAILURE) << table;
    EXPECT_THAT(errors_, HasSubstr("Localizable.strings:" + reason));
  }

  lumora::tests::TemporaryFolder folder_;
  std::string errors_;
};

TEST_F(EmbedStringsTest, acceptsEntriesCommentsAndEscapes) {
  ASSERT_EQ(compile("/* one */ // two\n\"b\\U2026\" = \"\\\"ü\\\"\\n\\\\…\"; \"a\"=\"text\";\n"), 0) << errors_;
  EXPECT_THAT(source(), HasSubstr("{\"a\", \"text\"},\n    {\"b\\\\U2026\", \"\\\"ü\\\"\\n\\\\…\"},"));
  EXPECT_THAT(source(), HasSubstr("{\"xx\", table0}"));
}

TEST_F(EmbedStringsTest, refusesAMalformedTableWithItsLine) {
  expectRefused("\"a\" = \"b\"\n\"c\" = \"d\";", "2: expected ;");
  expectRefused("\"a\" \"b\";", "1: expected =");
  expectRefused("a = \"b\";", "1: expected \"");
  expectRefused("\n\"a\" = \"b", "2: the table ends inside an entry");
  expectRefused("\"a", "1: the table ends inside an entry");
  expectRefused("\"a\n\" = \"b\";", "2: a string without its end");
  expectRefused("\"a\" = \"b\"; /* end", "1: a comment without its end");
}

TEST_F(EmbedStringsTest, refusesAKeyThatStandsTwice) {
  expectRefused("\"a\" = \"b\";\n\"a\" = \"c\";\n", "2: a key stands twice");
}

TEST_F(EmbedStringsTest, refusesEmptyStrings) {
  expectRefused("\"\" = \"b\";", "1: an empty string");
  expectRefused("\"a\" = \"\";", "1: an empty string");
}

TEST_F(EmbedStringsTest, refusesTheEscapedEllipsisInATextAndUnknownEscapes) {
  expectRefused("\"a\\U2026\" = \"b\\U2026\";", "1: an escape that is not allowed here");
  expectRefused("\"a\\U2025\" = \"b\";", "1: an escape that is not allowed here");
  expectRefused("\"a\" = \"\\t\";", "1: an escape that is not allowed here");
}

TEST_F(EmbedStringsTest, refusesWhatIsNotUTF8) {
  expectRefused("\"a\" = \"\xfc\";", " cannot be read as UTF-8");
  expectRefused("\"a\" = \"\xe2\x80", " cannot be read as UTF-8");
}

TEST_F(EmbedStringsTest, refusesAMissingTable) {
  EXPECT_EQ(KTRunTask(LUMORA_EMBED_STRINGS, {output(), (folder_ / "none").string()}, "", nullptr, &errors_, nullptr),
            EXIT_FAILURE);
}

} // namespace
