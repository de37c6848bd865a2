#include "sandbox/agent/Authorizations.h"

#include <gtest/gtest.h>

using lumora::sandbox::Authorizations;

TEST(Authorizations, areGoodForTheirCallerOnly) {
  Authorizations authorizations;
  const std::string first = authorizations.give(":1.1");
  const std::string second = authorizations.give(":1.2");
  EXPECT_NE(first, second);
  EXPECT_TRUE(authorizations.isGoodFor(":1.1", first));
  EXPECT_FALSE(authorizations.isGoodFor(":1.2", first));
  EXPECT_FALSE(authorizations.isGoodFor(":1.3", first));
}

TEST(Authorizations, areNotGuessed) {
  Authorizations authorizations;
  const std::string given = authorizations.give(":1.1");
  EXPECT_EQ(given.size(), 32U);
  EXPECT_FALSE(authorizations.isGoodFor(":1.1", ""));
  EXPECT_FALSE(authorizations.isGoodFor(":1.1", given.substr(1)));
  EXPECT_FALSE(authorizations.isGoodFor(":1.1", given + 'x'));
}

TEST(Authorizations, areTheSame_whenAskedForAgain) {
  Authorizations authorizations;
  const std::string given = authorizations.give(":1.1");
  EXPECT_EQ(authorizations.give(":1.1"), given);
}

TEST(Authorizations, areOver_whenTheCallerHasLeft) {
  Authorizations authorizations;
  const std::string given = authorizations.give(":1.1");
  authorizations.forget(":1.1");
  EXPECT_FALSE(authorizations.isGoodFor(":1.1", given));
}
