#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/testing/FakeToolRunner.h>

#include <gmock/gmock.h>

#include <thread>

namespace lumora::tests {
namespace {

using fakes::FakeToolRunner;
using fakes::ToolReply;
using fakes::ToolRequest;
using testing::ElementsAre;

class FakeRunner : public testing::Test {
protected:
  int run(const Array& elements, const std::string& executable = "/usr/bin/lumctl") {
    return runner_.run(executable, {"--plistin"}, xmlDescription(elements).value(), output_, error_);
  }

  FakeToolRunner runner_;
  std::string output_;
  std::string error_;
};

TEST_F(FakeRunner, answersEmptyDictionary_whenNothingIsScripted) {
  EXPECT_EQ(run({"listworkflows"}), 0);
  EXPECT_EQ(dictionaryWithXMLDescription(output_), Dictionary());
  EXPECT_EQ(error_, "");
}

TEST_F(FakeRunner, answersByCommand) {
  runner_.reply("listinfo", ToolReply::success({{"version", "1"}}));
  runner_.reply("submit", ToolReply::failure(26, "no"));
  EXPECT_EQ(run({Array{"server", "host:8170"}, "listinfo", Array{"submit", "x"}}), 0);
  EXPECT_EQ(dictionaryWithXMLDescription(output_)->string("version"), "1");
  EXPECT_EQ(run({"submit"}), 26);
  EXPECT_EQ(error_, "no");
}

TEST_F(FakeRunner, answersByExecutable_whenCommandIsNotScripted) {
  runner_.reply("/usr/bin/lumaction", ToolReply::failure(5));
  EXPECT_EQ(run(Array{Value(Array{"subcommand", "start"})}, "/usr/bin/lumaction"), 5);
  runner_.reply("start", ToolReply::failure(6));
  EXPECT_EQ(run(Array{Value(Array{"subcommand", "start"})}, "/usr/bin/lumaction"), 6);
}

TEST_F(FakeRunner, givesSingleRepliesFirst) {
  runner_.reply("listinfo", ToolReply::failure(1));
  runner_.replyOnce("listinfo", ToolReply::failure(2));
  runner_.replyOnce("listinfo", ToolReply::failure(3));
  EXPECT_EQ(run({"listinfo"}), 2);
  EXPECT_EQ(run({"listinfo"}), 3);
  EXPECT_EQ(run({"listinfo"}), 1);
}

TEST_F(FakeRunner, asksHandlerFirst) {
  runner_.reply("submit", ToolReply::failure(1));
  runner_.setHandler([](const ToolRequest& request) -> std::optional<ToolReply> {
    return request.value("user") == "anna" ? std::optional(ToolReply::failure(2)) : std::nullopt;
  });
  EXPECT_EQ(run({Array{"user", "anna"}, "submit"}), 2);
  EXPECT_EQ(run({Array{"user", "otto"}, "submit"}), 1);
}

TEST_F(FakeRunner, recordsRequestsParsedAndRaw) {
  run({Array{"server", "host:8170"}, Array{"user"}, "submit", Array{"async"}});
  const auto request = runner_.requests().at(0);
  EXPECT_EQ(request.executable, "/usr/bin/lumctl");
  EXPECT_THAT(request.arguments, ElementsAre("--plistin"));
  EXPECT_EQ(request.standardInput, xmlDescription(request.elements));
  EXPECT_EQ(request.command(), "submit");
  EXPECT_EQ(request.value("server"), "host:8170");
  EXPECT_EQ(request.value("user"), std::nullopt);
  EXPECT_TRUE(request.contains("async"));
  EXPECT_TRUE(request.contains("submit"));
  EXPECT_FALSE(request.contains("delete"));
  runner_.forgetRequests();
  EXPECT_EQ(runner_.requestCount(), 0U);
}

TEST_F(FakeRunner, recordsRequest_whenInputIsNoPropertyList) {
  std::string output;
  runner_.run("/bin/tool", {}, "plain text", output, output);
  EXPECT_EQ(runner_.requests().at(0).standardInput, "plain text");
  EXPECT_EQ(runner_.requests().at(0).command(), "");
}

TEST_F(FakeRunner, answersOnlyAfterRelease_whenBlocked) {
  runner_.block();
  std::atomic<bool> answered{false};
  std::thread caller([&] {
    run({"listinfo"});
    answered = true;
  });
  EXPECT_TRUE(runner_.waitForRequests(1));
  EXPECT_FALSE(answered);
  EXPECT_THAT(runner_.commands(), ElementsAre("listinfo"));
  runner_.release();
  caller.join();
  EXPECT_TRUE(answered);
}

} // namespace
} // namespace lumora::tests
