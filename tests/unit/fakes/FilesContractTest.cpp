#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/PosixFiles.h>
#include <LumoraKit/testing/FakeFiles.h>

#include <gmock/gmock.h>

#include <cerrno>

namespace lumora::tests {
namespace {

// One contract for the machine's files and for the fake, so that a test on the fake means what it says.
struct Subject {
  const char* name;
  std::shared_ptr<Files> (*make)();
};

void PrintTo(const Subject& subject, std::ostream* out) {
  *out << subject.name;
}

class FilesContract : public testing::TestWithParam<Subject> {
protected:
  FilesContract() { EXPECT_EQ(files_->createDirectory(folder_.path()), nullptr); }

  static std::int64_t code(const LMRErrorRef& error) { return error ? error->code() : 0; }

  TemporaryFolder folder_;
  std::shared_ptr<Files> files_ = GetParam().make();
};

INSTANTIATE_TEST_SUITE_P(
    All, FilesContract,
    testing::Values(Subject{"machine",
                            []() -> std::shared_ptr<Files> { return std::make_shared<backend::PosixFiles>(); }},
                    Subject{"fake", []() -> std::shared_ptr<Files> { return std::make_shared<fakes::FakeFiles>(); }}),
    [](const auto& subject) { return subject.param.name; });

TEST_P(FilesContract, createsDirectoryWithItsParents) {
  EXPECT_EQ(files_->createDirectory(folder_ / "a/b/c"), nullptr);
  EXPECT_TRUE(files_->isDirectory(folder_ / "a"));
  EXPECT_TRUE(files_->isDirectory(folder_ / "a/b/c/"));
  EXPECT_FALSE(files_->isDirectory(folder_ / "b"));
}

TEST_P(FilesContract, acceptsDirectoryThatIsThere) {
  EXPECT_EQ(files_->createDirectory(folder_ / "a"), nullptr);
  EXPECT_EQ(files_->createDirectory(folder_ / "a"), nullptr);
}

TEST_P(FilesContract, refusesDirectory_whereFileIs) {
  ASSERT_EQ(files_->writeAtomically(folder_ / "file", "text"), nullptr);
  EXPECT_EQ(code(files_->createDirectory(folder_ / "file")), EEXIST);
  EXPECT_EQ(code(files_->createDirectory(folder_ / "file/below")), EEXIST);
  EXPECT_FALSE(files_->isDirectory(folder_ / "file"));
}

TEST_P(FilesContract, refusesToWrite_whereNoFolderIs) {
  EXPECT_EQ(code(files_->writeAtomically(folder_ / "absent/file", "text")), ENOENT);
}

TEST_P(FilesContract, refusesToWriteOverDirectory) {
  ASSERT_EQ(files_->createDirectory(folder_ / "a"), nullptr);
  EXPECT_EQ(code(files_->writeAtomically(folder_ / "a", "text")), EISDIR);
  EXPECT_TRUE(files_->isDirectory(folder_ / "a"));
}

TEST_P(FilesContract, removesFileOnce) {
  ASSERT_EQ(files_->writeAtomically(folder_ / "file", "text"), nullptr);
  EXPECT_EQ(files_->removeFile(folder_ / "file"), nullptr);
  EXPECT_EQ(code(files_->removeFile(folder_ / "file")), ENOENT);
}

TEST_P(FilesContract, tellsTheSizeOfAFile_andOfNothingElse) {
  ASSERT_EQ(files_->writeAtomically(folder_ / "file", "0123456789"), nullptr);
  EXPECT_EQ(files_->sizeOfFile(folder_ / "file", nullptr), 10U);
  LMRErrorRef error;
  EXPECT_EQ(files_->sizeOfFile(folder_ / "absent", &error), std::nullopt);
  EXPECT_EQ(code(error), ENOENT);
  EXPECT_EQ(files_->sizeOfFile(folder_.path(), &error), std::nullopt);
  EXPECT_EQ(code(error), EINVAL);
}

TEST_P(FilesContract, readsAPart_upToTheEndOfTheFile) {
  ASSERT_EQ(files_->writeAtomically(folder_ / "file", "0123456789"), nullptr);
  EXPECT_EQ(files_->partOfFile(folder_ / "file", 0, 4, nullptr), "0123");
  EXPECT_EQ(files_->partOfFile(folder_ / "file", 8, 4, nullptr), "89");
  EXPECT_EQ(files_->partOfFile(folder_ / "file", 8, 0, nullptr), "");
  EXPECT_EQ(files_->partOfFile(folder_ / "file", 10, 4, nullptr), "");
  EXPECT_EQ(files_->partOfFile(folder_ / "file", 1ULL << 40U, 4, nullptr), "");
  LMRErrorRef error;
  EXPECT_EQ(files_->partOfFile(folder_ / "absent", 0, 4, &error), std::nullopt);
  EXPECT_EQ(code(error), ENOENT);
}

TEST_P(FilesContract, cutsAFile_andMakesNoneLonger) {
  ASSERT_EQ(files_->writeAtomically(folder_ / "file", "0123456789"), nullptr);
  EXPECT_EQ(files_->truncateFile(folder_ / "file", 4), nullptr);
  EXPECT_EQ(files_->contentOfFile(folder_ / "file", nullptr), "0123");
  EXPECT_EQ(code(files_->truncateFile(folder_ / "file", 5)), EINVAL);
  EXPECT_EQ(files_->contentOfFile(folder_ / "file", nullptr), "0123");
  EXPECT_EQ(code(files_->truncateFile(folder_ / "absent", 0)), ENOENT);
}

TEST(FakeFiles, keepsWhatWasWrittenLast) {
  fakes::FakeFiles files;
  EXPECT_EQ(files.writeAtomically("/file", "old"), nullptr);
  EXPECT_EQ(files.writeAtomically("/./file", "new"), nullptr);
  EXPECT_EQ(files.content("/file"), "new");
  EXPECT_THAT(files.files(), testing::ElementsAre("/file"));
  EXPECT_EQ(files.content("/other"), std::nullopt);
}

TEST(FakeFiles, changesNothing_whileDiskIsFull) {
  fakes::FakeFiles files;
  ASSERT_EQ(files.writeAtomically("/file", "old"), nullptr);
  files.setFailure(ENOSPC);
  EXPECT_EQ(files.writeAtomically("/file", "new")->code(), ENOSPC);
  EXPECT_EQ(files.createDirectory("/a")->code(), ENOSPC);
  EXPECT_EQ(files.content("/file"), "old");
  EXPECT_FALSE(files.isDirectory("/a"));
  files.setFailure(0);
  EXPECT_EQ(files.writeAtomically("/file", "new"), nullptr);
}

TEST(FakeFiles, hasOneApplicationSupportDirectory_untilToldOtherwise) {
  fakes::FakeFiles files;
  EXPECT_THAT(files.applicationSupportDirectories(), testing::ElementsAre("/home/user/.local/share"));
  files.setApplicationSupportDirectories({});
  EXPECT_THAT(files.applicationSupportDirectories(), testing::IsEmpty());
}

} // namespace
} // namespace lumora::tests
