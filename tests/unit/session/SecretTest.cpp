#include <LumoraKit/platform/Secret.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <optional>

namespace {

using lumora::Secret;

bool isBlank(const char* bytes, std::size_t count) {
  return std::all_of(bytes, bytes + count, [](char byte) { return byte == '\0'; });
}

TEST(SecretTest, wipe_overwritesTheWholeMemory) {
  std::string text(100, 'x');
  const char* const bytes = text.data();
  lumora::wipe(text);
  EXPECT_TRUE(text.empty());
  // A cleared string keeps its memory.
  ASSERT_EQ(text.data(), bytes);
  EXPECT_TRUE(isBlank(bytes, text.capacity()));
}

TEST(SecretTest, wipe_overwritesWhatAMoveLeftBehind_whenShort) {
  std::string text = "hunter2";
  const std::string moved = std::move(text);
  lumora::wipe(text);
  EXPECT_TRUE(isBlank(text.data(), text.capacity()));
}

TEST(SecretTest, text_isWiped_whenItDies) {
  // Built in place, so that its memory can be looked at after its end.
  alignas(Secret) unsigned char memory[sizeof(Secret)] = {};
  auto* const secret = new (memory) Secret("hunter2");
  EXPECT_EQ(secret->text(), "hunter2");
  secret->~Secret();
  const std::string_view rest(reinterpret_cast<const char*>(memory), sizeof memory);
  EXPECT_EQ(rest.find("hunter2"), std::string_view::npos);
}

TEST(SecretTest, text_survivesCopyMoveAndAssignment) {
  Secret secret("first");
  const Secret copy = secret;
  secret = Secret("second");
  const Secret moved = std::move(secret);
  EXPECT_EQ(copy.text(), "first");
  EXPECT_EQ(moved.text(), "second");
}

} // namespace
