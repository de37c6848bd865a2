#include <LumoraKit/actions/LMRApplicationSupportDirectory.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>

using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;

namespace {

class ApplicationSupportDirectoryTest : public testing::Test {
protected:
  lumora::fakes::FakePlatform platform_;
};

TEST_F(ApplicationSupportDirectoryTest, isNamedAfterTheApplicationAndMade) {
  EXPECT_FALSE(platform_.files->isDirectory("/home/user/.local/share/LumoraTest"));
  EXPECT_EQ(LMRApplicationSupportDirectory(), "/home/user/.local/share/LumoraTest");
  EXPECT_TRUE(platform_.files->isDirectory("/home/user/.local/share/LumoraTest"));
}

TEST_F(ApplicationSupportDirectoryTest, isLeftAlone_whenItIsThere) {
  ASSERT_FALSE(platform_.files->createDirectory("/home/user/.local/share/LumoraTest"));
  platform_.files->setFailure(EROFS);
  EXPECT_EQ(LMRApplicationSupportDirectory(), "/home/user/.local/share/LumoraTest");
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(ApplicationSupportDirectoryTest, isInTheFirstFolder_whenThereAreSeveral) {
  platform_.files->setApplicationSupportDirectories({"/first", "/second"});
  EXPECT_EQ(LMRApplicationSupportDirectory(), "/first/LumoraTest");
}

TEST_F(ApplicationSupportDirectoryTest, isAbsent_whenTheUserHasNoFolder) {
  platform_.files->setApplicationSupportDirectories({});
  EXPECT_EQ(LMRApplicationSupportDirectory(), std::nullopt);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(ApplicationSupportDirectoryTest, isAbsentAndLogged_whenAPlainFileIsInItsPlace) {
  ASSERT_FALSE(platform_.files->createDirectory("/home/user/.local/share"));
  ASSERT_FALSE(platform_.files->writeAtomically("/home/user/.local/share/LumoraTest", "a file"));
  EXPECT_EQ(LMRApplicationSupportDirectory(), std::nullopt);
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre(StartsWith("createDirectoryAtPath:/home/user/.local/share/LumoraTest failed ")));
}

} // namespace
