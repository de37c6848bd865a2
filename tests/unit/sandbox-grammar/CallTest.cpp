#include "Refusals.h"

#include <sandbox/protocol/Call.h>

using namespace lumora;
using namespace lumora::sandbox;
using testing::HasSubstr;
using testing::Not;

namespace {

const Array server{"server", "localhost:8170"};
const Array password{"auth", "Password"};
const Array user{"user", "ada"};
const Array pass{"pass", "geheim"};

/// A call together with the elements that it refers to.
struct Parsed {
  std::vector<Element> elements;
  Call call;
};

Parsed parsed(const Array& request, ToolKind tool = ToolKind::Main) {
  Parsed result{parseRequest(textOf(request)), {}};
  result.call = parseCall(result.elements, tool);
  return result;
}

Refusal refusalOfCall(const Array& request, ToolKind tool = ToolKind::Main) {
  return refusalOf([&] { parsed(request, tool); });
}

} // namespace

TEST(Call, carriesCredentialsAndCommand_whenTheSessionHasAPassword) {
  for (const auto tool : {ToolKind::Main, ToolKind::Exec}) {
    const auto [elements, call] = parsed({server, password, user, pass, "listworkflows"}, tool);
    EXPECT_EQ(call.credentials->server.host, "localhost");
    EXPECT_EQ(call.credentials->server.port, 8170);
    EXPECT_EQ(call.credentials->user, "ada");
    EXPECT_EQ(call.credentials->password, "geheim");
    EXPECT_EQ(call.command, "listworkflows");
    EXPECT_FALSE(call.isVerb);
    EXPECT_TRUE(call.arguments.empty());
  }
}

TEST(Call, hasNoUser_whenTheSessionIsKerberos) {
  const auto [elements, call] = parsed({server, Array{"auth", "Kerberos"}, "listworkflows"});
  ASSERT_TRUE(call.credentials);
  EXPECT_FALSE(call.credentials->user);
}

TEST(Call, hasNoCredentials_whenTheCommandComesFirst) {
  const auto [elements, call] = parsed({"getconfig", "plist"});
  EXPECT_FALSE(call.credentials);
  EXPECT_EQ(call.command, "getconfig");
  EXPECT_EQ(call.arguments.size(), 1U);
}

TEST(Call, serverIsAnArgument_whenItFollowsTheCommand) {
  const auto [elements, call] = parsed({"listinfo", server});
  EXPECT_FALSE(call.credentials);
  EXPECT_EQ(call.arguments.front().word, "server");
}

TEST(Call, verbStaysAmongTheArguments_whenThereIsNoCommandWord) {
  const auto [elements, call] = parsed({server, password, user, pass, Array{"start", "Studio A"}, Array{"delay", 5}});
  EXPECT_EQ(call.command, "start");
  EXPECT_TRUE(call.isVerb);
  EXPECT_EQ(call.arguments.size(), 2U);
}

TEST(Call, auxiliaryToolTakesSubcommand_withoutAnAuthElement) {
  const auto [elements, call] =
      parsed({server, user, pass, Array{"subcommand", "workflow"}, Array{"workflow", "w"}}, ToolKind::Action);
  EXPECT_EQ(call.credentials->user, "ada");
  EXPECT_EQ(call.command, "workflow");
  EXPECT_EQ(call.arguments.size(), 1U);
}

TEST(Call, auxiliaryToolHasNoUser_whenTheSubcommandFollowsTheServer) {
  const auto [elements, call] = parsed({server, Array{"subcommand", "workflow"}}, ToolKind::Action);
  ASSERT_TRUE(call.credentials);
  EXPECT_FALSE(call.credentials->user);
}

TEST(Call, emptyPasswordIsWellFormed_becauseTheServerDecides) {
  const auto [elements, call] = parsed({server, password, user, Array{"pass", ""}, "listworkflows"});
  EXPECT_EQ(call.credentials->password, "");
}

struct BadCall {
  const char* name;
  Array request;
  const char* reason;
  ToolKind tool = ToolKind::Main;
};

class CallRefused : public testing::TestWithParam<BadCall> {};

TEST_P(CallRefused, isInvalidArguments_when) {
  const auto refusal = refusalOfCall(GetParam().request, GetParam().tool);
  EXPECT_THAT(refusal, IsRefusal(Status::InvalidArguments, GetParam().reason));
  EXPECT_THAT(refusal.what(), Not(HasSubstr("geheim")));
}

INSTANTIATE_TEST_SUITE_P(
    Elements, CallRefused,
    testing::Values(
        BadCall{"empty", {}, "the command is missing"},
        BadCall{"serverOnly", only(server), "(\"auth\", ...) is missing"},
        BadCall{"authMissing", {server, user, pass, "listworkflows"}, "(\"auth\", ...) is missing: in its place"},
        BadCall{"authUnknown", {server, Array{"auth", "Basic"}, "listworkflows"}, "neither \"Password\" nor"},
        BadCall{"authInLowerCase", {server, Array{"auth", "password"}, user, pass, "x"}, "neither \"Password\" nor"},
        BadCall{"userMissing", {server, password, pass, "listworkflows"}, "(\"user\", ...) is missing"},
        BadCall{"passMissing", {server, password, user, "listworkflows"}, "(\"pass\", ...) is missing"},
        BadCall{"passBeforeUser", {server, password, pass, user, "listworkflows"}, "(\"user\", ...) is missing"},
        BadCall{"userAsWord", {server, password, "user", pass, "x"}, "in its place stands the word \"user\""},
        BadCall{"userWithoutValue", {server, password, Array{"user"}, pass, "x"}, "(\"user\") has no value"},
        BadCall{"passWithoutValue", {server, password, user, Array{"pass"}, "x"}, "(\"pass\") has no value"},
        BadCall{"passTwice", {server, password, user, Array{"pass", "geheim", "y"}, "x"}, "more than one value"},
        BadCall{"userANumber", {server, password, Array{"user", 5}, pass, "x"}, "is not a string"},
        BadCall{"commandMissing", {server, password, user, pass}, "the command is missing"},
        BadCall{"serverWithoutValue", {Array{"server"}, password, user, pass, "x"}, "(\"server\") has no value"},
        BadCall{
            "auxiliaryWithAuth", {server, password, user, pass}, "(\"subcommand\", ...) is missing", ToolKind::Action},
        BadCall{"auxiliaryWithWord",
                {server, user, pass, "workflow"},
                "(\"subcommand\", ...) is missing",
                ToolKind::Action},
        BadCall{"auxiliaryWithoutPass",
                {server, user, Array{"subcommand", "workflow"}},
                "(\"pass\", ...)",
                ToolKind::Action}),
    [](const auto& call) { return call.param.name; });

TEST(Address, hostAndPortAreSplitAtTheLastColon) {
  const auto address = parseAddress("::1:8080");
  EXPECT_EQ(address.host, "::1");
  EXPECT_EQ(address.port, 8080);
}

TEST(Address, isInvalidArguments_whenItIsNotHostAndPort) {
  for (const auto* text : {"", "localhost", ":8170", "localhost:", "localhost:x", "localhost:65536", "localhost:-1",
                           "localhost:8170 ", "localhost:+1"}) {
    EXPECT_EQ(refusalOf([&] { parseAddress(text); }).status(), Status::InvalidArguments) << text;
  }
}
