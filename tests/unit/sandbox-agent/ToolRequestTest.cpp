#include "sandbox/agent/PrivilegedTool.h"
#include "support/ValuePrinter.h"

#include <gtest/gtest.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::sandbox::toolRequest;

TEST(ToolRequest, isTheLoginTheCommandAndTheSubarguments) {
  EXPECT_EQ(
      toolRequest(
          "bind",
          {{"subarguments", Array{"Studio A"}}, {"server", "localhost:8170"}, {"user", "ada"}, {"pass", "apple"}}),
      (Array{Array{"server", "localhost:8170"}, Array{"auth", "Password"}, Array{"user", "ada"}, Array{"pass", "apple"},
             "bind", "Studio A"}));
}

TEST(ToolRequest, hasNoLogin_whenThereIsNone) {
  EXPECT_EQ(toolRequest("setconfig", {{"subarguments", Array{"Capture=high"}}}), (Array{"setconfig", "Capture=high"}));
}

TEST(ToolRequest, isNone_whenThereAreNoSubarguments) {
  EXPECT_EQ(toolRequest("setconfig", {}), std::nullopt);
  EXPECT_EQ(toolRequest("setconfig", {{"subarguments", "Capture=high"}}), std::nullopt);
}

TEST(ToolRequest, isNone_whenTheLoginIsNotWhole) {
  const Array arguments{"Studio A"};
  EXPECT_EQ(toolRequest("bind", {{"subarguments", arguments}, {"server", "localhost:8170"}}), std::nullopt);
  EXPECT_EQ(toolRequest("bind", {{"subarguments", arguments}, {"server", "localhost:8170"}, {"user", "ada"}}),
            std::nullopt);
  EXPECT_EQ(toolRequest("bind", {{"subarguments", arguments}, {"server", 8170}, {"user", "ada"}, {"pass", "x"}}),
            std::nullopt);
}
