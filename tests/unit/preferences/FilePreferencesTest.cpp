#include "support/Descriptors.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/FilePreferences.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>

#include <filesystem>
#include <set>

#include <sys/stat.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

using backend::FilePreferences;

const std::string domain = "org.vantor.lumora.test";

class Preferences : public testing::Test {
protected:
  std::set<std::string> files() const {
    std::set<std::string> names;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(folder_.path())) {
      names.insert(entry.path().filename().string());
    }
    return names;
  }

  std::filesystem::path file() const { return folder_ / (domain + ".plist"); }

  fakes::FakePlatform platform_;
  TemporaryFolder folder_;
  FilePreferences preferences_{folder_.path()};
};

TEST_F(Preferences, keepValuesOfEveryType) {
  const Dictionary record{{"string", "ü & <"},    {"number", -7},   {"flag", true},           {"real", 0.1},
                          {"data", Data{0, 255}}, {"date", Date{}}, {"list", Array{1, "two"}}};
  preferences_.setValue(domain, "record", record);
  EXPECT_EQ(preferences_.value(domain, "record"), Value(record));
}

TEST_F(Preferences, areSeenByEveryInstanceAtOnce) {
  FilePreferences other(folder_.path());
  preferences_.setValue(domain, "key", 1);
  EXPECT_EQ(other.value(domain, "key"), Value(1));
  other.setValue(domain, "key", 2);
  EXPECT_EQ(preferences_.value(domain, "key"), Value(2));
}

TEST_F(Preferences, keepOtherKeys_whenOneChanges) {
  preferences_.setValue(domain, "one", 1);
  preferences_.setValue(domain, "two", 2);
  preferences_.setValue(domain, "one", 3);
  preferences_.setValue(domain, "two", std::nullopt);
  EXPECT_EQ(dictionaryWithXMLDescription(contentOf(file())), (Dictionary{{"one", 3}}));
  EXPECT_EQ(preferences_.value(domain, "two"), std::nullopt);
}

TEST_F(Preferences, areApartByDomain) {
  preferences_.setValue("one", "key", 1);
  preferences_.setValue("two", "key", 2);
  EXPECT_EQ(preferences_.value("one", "key"), Value(1));
  EXPECT_EQ(preferences_.value("two", "key"), Value(2));
}

TEST_F(Preferences, createNothing_whenRead) {
  EXPECT_EQ(preferences_.value(domain, "key"), std::nullopt);
  EXPECT_TRUE(files().empty());
}

TEST_F(Preferences, createNoFile_whenAbsentKeyIsRemoved) {
  preferences_.setValue(domain, "key", std::nullopt);
  EXPECT_FALSE(std::filesystem::exists(file()));
}

TEST_F(Preferences, leaveFileUntouched_whenValueIsThereAlready) {
  preferences_.setValue(domain, "key", "value");
  struct stat before {};
  struct stat after {};
  stat(file().c_str(), &before);
  preferences_.setValue(domain, "key", "value");
  stat(file().c_str(), &after);
  EXPECT_EQ(before.st_ino, after.st_ino);
}

TEST_F(Preferences, makeFolder_whenMissing) {
  FilePreferences below(folder_ / "a/b");
  below.setValue(domain, "key", 1);
  EXPECT_EQ(below.value(domain, "key"), Value(1));
  struct stat status {};
  stat((folder_ / "a").c_str(), &status);
  EXPECT_EQ(status.st_mode & 0777U, 0700U);
}

TEST_F(Preferences, areReadableByUserOnly) {
  preferences_.setValue(domain, "key", 1);
  struct stat status {};
  stat(file().c_str(), &status);
  EXPECT_EQ(status.st_mode & 0777U, 0600U);
}

TEST_F(Preferences, setDamagedFileAside_whenChanged) {
  const std::string damaged = "<plist version=\"1.0\"><dict><key>half";
  writeFile(file(), damaged);
  EXPECT_EQ(preferences_.value(domain, "key"), std::nullopt);
  EXPECT_EQ(contentOf(file()), damaged);
  preferences_.setValue(domain, "key", 1);
  EXPECT_EQ(preferences_.value(domain, "key"), Value(1));
  bool kept = false;
  for (const std::string& name : files()) {
    kept = kept || (name.starts_with(domain + ".plist.damaged-") && contentOf(folder_ / name) == damaged);
  }
  EXPECT_TRUE(kept);
  EXPECT_EQ(platform_.log->count("is damaged and was kept as"), 1U);
}

TEST_F(Preferences, setFileAside_whenItsRootIsNoDictionary) {
  writeFile(file(), xmlDescription(Array{1, 2}).value());
  preferences_.setValue(domain, "key", 1);
  EXPECT_EQ(files().size(), 3U) << "the new file, the lock and the old file";
}

TEST_F(Preferences, setEmptyFileAside) {
  writeFile(file(), "");
  preferences_.setValue(domain, "key", 1);
  EXPECT_EQ(preferences_.value(domain, "key"), Value(1));
}

TEST_F(Preferences, logAndKeepFile_whenValueCannotBeWritten) {
  preferences_.setValue(domain, "key", "value");
  preferences_.setValue(domain, "key", std::string("\x01"));
  EXPECT_EQ(preferences_.value(domain, "key"), Value("value"));
  EXPECT_EQ(platform_.log->count("Cannot save the preference key of " + domain), 1U);
}

TEST_F(Preferences, logAndGoOn_whenFolderCannotBeMade) {
  writeFile(folder_ / "file", "");
  FilePreferences below(folder_ / "file/below");
  below.setValue(domain, "key", 1);
  EXPECT_EQ(below.value(domain, "key"), std::nullopt);
  EXPECT_EQ(platform_.log->count("Cannot save the preference"), 1U);
}

TEST_F(Preferences, logAndGoOn_whenFileIsFolder) {
  std::filesystem::create_directory(file());
  preferences_.setValue(domain, "key", 1);
  EXPECT_EQ(preferences_.value(domain, "key"), std::nullopt);
  EXPECT_EQ(platform_.log->count("Cannot save the preference"), 1U);
  EXPECT_TRUE(std::filesystem::is_directory(file()));
}

TEST_F(Preferences, logAndGoOn_whenFolderIsReadOnly) {
  if (geteuid() == 0) {
    GTEST_SKIP() << "root may write to any folder";
  }
  std::filesystem::permissions(folder_.path(), std::filesystem::perms::owner_read | std::filesystem::perms::owner_exec);
  preferences_.setValue(domain, "key", 1);
  std::filesystem::permissions(folder_.path(), std::filesystem::perms::owner_all);
  EXPECT_EQ(preferences_.value(domain, "key"), std::nullopt);
  EXPECT_EQ(platform_.log->count("Cannot save the preference"), 1U);
}

TEST_F(Preferences, logAndGoOn_whenThereIsNoHome) {
  FilePreferences homeless("");
  homeless.setValue(domain, "key", 1);
  EXPECT_EQ(homeless.value(domain, "key"), std::nullopt);
  EXPECT_EQ(platform_.log->count("Cannot save the preference"), 1U);
}

TEST_F(Preferences, stayInTheirFolder_whateverTheDomain) {
  FilePreferences inner(folder_ / "inner");
  const std::vector<std::string> domains{"../escaped", "/escaped",           "a/b", "a%2Fb", "..",
                                         ".",          std::string(1, '\0'), "",    "a\nb",  "%"};
  for (std::size_t i = 0; i < domains.size(); ++i) {
    inner.setValue(domains[i], "key", static_cast<int>(i));
  }
  for (std::size_t i = 0; i < domains.size(); ++i) {
    EXPECT_EQ(inner.value(domains[i], "key"), Value(static_cast<int>(i))) << domains[i];
  }
  for (const auto& entry : std::filesystem::recursive_directory_iterator(folder_.path())) {
    EXPECT_TRUE(entry.path() == folder_ / "inner" || entry.path().parent_path() == folder_ / "inner") << entry.path();
  }
}

TEST_F(Preferences, leaveNoDescriptorsOpen) {
  preferences_.setValue(domain, "key", 0);
  const auto before = openDescriptors();
  for (int i = 1; i < 10; ++i) {
    preferences_.setValue(domain, "key", i);
    preferences_.value(domain, "key");
  }
  EXPECT_EQ(openDescriptors(), before);
  EXPECT_EQ(files().size(), 2U) << "the file and its lock";
}

} // namespace
} // namespace lumora::tests
