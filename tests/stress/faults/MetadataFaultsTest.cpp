#include "FaultRun.h"
#include "OnDisk.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/actions/LMRActionFactoryAdditions.h>
#include <LumoraKit/platform/PropertyList.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <optional>
#include <string>

namespace lumora::tests {
namespace {

const Dictionary metadata{{"Title", "Lecture 1"}, {"Description", std::string(100'000, 'd')}};
const std::vector<std::string> writingCalls{"mkdir", "mkostemp", "write", "fsync", "rename", "close", "getrandom"};

// A file, whole, at the path that was given out; or none, and a line in the log.
class MetadataFile : public FaultScenario {
public:
  using FaultScenario::FaultScenario;

  void check(const Fault& fault) override {
    EXPECT_TRUE(path_ || fault.call != 0);
    EXPECT_EQ(filesBelow(folder_).size(), path_ ? 1U : 0U);
    EXPECT_EQ(disk_.platform.log->lines().size(), path_ ? 0U : 1U);
    if (path_) {
      checkContent(contentOf(*path_));
    }
  }

protected:
  virtual void checkContent(const std::string& content) const = 0;

  const OnDisk disk_{folder_};
  std::optional<std::string> path_;
};

class UserMetadata final : public MetadataFile {
public:
  using MetadataFile::MetadataFile;
  void act() override { path_ = LMRActionFactoryAdditions::writeToApplicationSupport(metadata); }

protected:
  void checkContent(const std::string& content) const override {
    EXPECT_EQ(dictionaryWithXMLDescription(content), metadata);
  }
};

TEST(MetadataFaults, areLogged_andLeaveNoPartOfAUserMetadataFile) {
  expectHolds(runWithFaults<UserMetadata>(), writingCalls);
}

class RecordingMetadata final : public MetadataFile {
public:
  using MetadataFile::MetadataFile;
  void act() override { path_ = LMRActionFactoryAdditions::writeXMLToApplicationSupport(metadata); }

protected:
  void checkContent(const std::string& content) const override {
    EXPECT_TRUE(content.ends_with("</LumoraServerAgentRecordingProperties>\n"));
  }
};

TEST(MetadataFaults, areLogged_andLeaveNoPartOfARecordingPropertiesFile) {
  expectHolds(runWithFaults<RecordingMetadata>(), writingCalls);
}

} // namespace
} // namespace lumora::tests
