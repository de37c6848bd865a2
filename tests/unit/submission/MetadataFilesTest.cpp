#include "SubmissionTest.h"

#include <LumoraKit/actions/LMRActionFactoryAdditions.h>
#include <LumoraKit/actions/LMRApplicationSupportDirectory.h>

#include <gmock/gmock.h>

#include <cerrno>
#include <chrono>
#include <thread>
#include <vector>

using LMRActionFactoryAdditions::writeToApplicationSupport;
using LMRActionFactoryAdditions::writeXMLToApplicationSupport;
using lumora::Dictionary;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::MatchesRegex;
using testing::SizeIs;

namespace {

class MetadataFilesTest : public lumora::tests::SubmissionTest {
protected:
  std::string recordingProperties(const Dictionary& dictionary) const {
    return content(writeXMLToApplicationSupport(dictionary).value_or(""));
  }
};

TEST_F(MetadataFilesTest, recordingProperties_haveNoChildren_whenTheDictionaryIsEmpty) {
  EXPECT_EQ(recordingProperties({}), "<?xml version=\"1.0\"?>\n"
                                     "<LumoraServerAgentRecordingProperties>\n"
                                     "  <RecordingProperties />\n"
                                     "</LumoraServerAgentRecordingProperties>\n");
}

TEST_F(MetadataFilesTest, recordingProperties_holdDateNumberAndStringInTheDictionarysOrder) {
  using namespace std::chrono;
  const lumora::Date start = sys_days(2010y / January / 20) + 15h + 4min + 5s;
  const Dictionary dictionary{
      {"RecordingMetadata_START_DATE", start}, {"RecordingMetadata_DURATION", 12}, {"Another", "a string"}};
  EXPECT_EQ(recordingProperties(dictionary),
            "<?xml version=\"1.0\"?>\n"
            "<LumoraServerAgentRecordingProperties>\n"
            "  <RecordingProperties>\n"
            "    <RecordingProperty key=\"RecordingMetadata_START_DATE\" value=\"2010-01-20 15:04:05 +0000\" />\n"
            "    <RecordingProperty key=\"RecordingMetadata_DURATION\" value=\"12\" />\n"
            "    <RecordingProperty key=\"Another\" value=\"a string\" />\n"
            "  </RecordingProperties>\n"
            "</LumoraServerAgentRecordingProperties>\n");
}

TEST_F(MetadataFilesTest, recordingProperties_escapeWhatXMLUses) {
  EXPECT_THAT(recordingProperties({{"a<b", "\"quoted\" & more\nlines\té"}}),
              HasSubstr("key=\"a&lt;b\" value=\"&quot;quoted&quot; &amp; more&#10;lines&#09;é\""));
}

TEST_F(MetadataFilesTest, recordingProperties_areNotWritten_whenXMLCannotCarryThem) {
  EXPECT_EQ(writeXMLToApplicationSupport({{"key", "bell\a"}}), std::nullopt);
  EXPECT_EQ(writeXMLToApplicationSupport({{"\xff", "value"}}), std::nullopt);
  EXPECT_THAT(platform_.files->files(), IsEmpty());
}

TEST_F(MetadataFilesTest, userMetadata_areWrittenAsAPropertyList) {
  const auto path = writeToApplicationSupport(userMetadata_);
  ASSERT_TRUE(path);
  EXPECT_EQ(content(*path), lumora::xmlDescription(userMetadata_));
}

TEST_F(MetadataFilesTest, userMetadata_areNotWritten_whenNoPropertyListCanHoldThem) {
  EXPECT_EQ(writeToApplicationSupport({{"Title", "bell\a"}}), std::nullopt);
  EXPECT_THAT(platform_.files->files(), IsEmpty());
}

TEST_F(MetadataFilesTest, names_areUUIDsInTheApplicationSupportFolder) {
  const std::string stem = "/home/user/.local/share/LumoraTest/"
                           "[0-9A-F]{8}-[0-9A-F]{4}-4[0-9A-F]{3}-[89AB][0-9A-F]{3}-[0-9A-F]{12}";
  EXPECT_THAT(writeToApplicationSupport({}).value_or(""), MatchesRegex(stem + "\\.plist"));
  EXPECT_THAT(writeXMLToApplicationSupport({}).value_or(""), MatchesRegex(stem + "\\.xml"));
}

TEST_F(MetadataFilesTest, eachCallWritesANewFile) {
  EXPECT_NE(writeToApplicationSupport(userMetadata_), writeToApplicationSupport(userMetadata_));
  EXPECT_NE(writeXMLToApplicationSupport({}), writeXMLToApplicationSupport({}));
  EXPECT_THAT(platform_.files->files(), SizeIs(4));
}

TEST_F(MetadataFilesTest, eachCallWritesANewFile_whenThreadsWriteAtOnce) {
  std::vector<std::jthread> threads;
  for (int thread = 0; thread < 8; ++thread) {
    threads.emplace_back([] {
      for (int round = 0; round < 50; ++round) {
        writeXMLToApplicationSupport({{"round", round}});
      }
    });
  }
  threads.clear();
  EXPECT_THAT(platform_.files->files(), SizeIs(400));
}

TEST_F(MetadataFilesTest, pathIsAbsentAndTheReasonLogged_whenTheDiskIsFull) {
  ASSERT_TRUE(LMRApplicationSupportDirectory());
  platform_.files->setFailure(ENOSPC);
  EXPECT_EQ(writeToApplicationSupport(userMetadata_), std::nullopt);
  EXPECT_EQ(writeXMLToApplicationSupport({}), std::nullopt);
  EXPECT_EQ(platform_.log->count("writeToFile:/home/user/.local/share/LumoraTest/"), 2U);
}

TEST_F(MetadataFilesTest, pathIsAbsent_whenThereIsNoFolder) {
  platform_.files->setApplicationSupportDirectories({});
  EXPECT_EQ(writeToApplicationSupport(userMetadata_), std::nullopt);
  EXPECT_EQ(writeXMLToApplicationSupport({}), std::nullopt);
}

} // namespace
