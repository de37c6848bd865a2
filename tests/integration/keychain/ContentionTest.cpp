#include "KeychainTest.h"
#include "Storer.h"

#include <vector>

namespace lumora::tests {
namespace {

class ContentionTest : public KeychainTest {};

TEST_F(ContentionTest, oneItemIsThereInTheEnd_whenSevenProcessesStoreItAtOnce) {
  constexpr int processes = 7;
  constexpr int passwords = 4;
  ASSERT_TRUE(keyring_.startService());
  std::vector<std::unique_ptr<ChildProgram>> storers;
  for (int i = 0; i < processes; ++i) {
    const int first = i * passwords;
    storers.push_back(
        ChildProgram::startSelf({storerRole, std::to_string(first), std::to_string(first + passwords - 1)}));
  }
  for (const auto& storer : storers) {
    ASSERT_EQ(storer->readLine(), "ready");
  }
  for (const auto& storer : storers) {
    storer->writeLine("go");
  }
  for (const auto& storer : storers) {
    EXPECT_EQ(storer->readLine(), "done");
  }
  EXPECT_EQ(keyring_.countItems("service", service), 1);
  const auto password = LMRKeychainAccess::passwordForUserName_server("ada", server);
  ASSERT_TRUE(password);
  EXPECT_EQ(password->find("password "), 0U);
}

} // namespace
} // namespace lumora::tests
