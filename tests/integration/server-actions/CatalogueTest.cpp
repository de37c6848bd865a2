// The whole catalogue in one table: what each factory method has the tool, or the helper agent, receive.
#include "Catalogue.h"

#include "RecordingTool.h"
#include "support/Sessions.h"
#include "support/ToolArguments.h"
#include "support/ValuePrinter.h"

#include <LumoraKit/actions/LMRPrivilegedAction.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/testing/FakeHelperAgent.h>

#include <gmock/gmock.h>

#include <filesystem>

using lumora::Array;
using lumora::Dictionary;
using lumora::Value;
using lumora::tests::CatalogueEntry;
using lumora::tests::kerberosSession;
using lumora::tests::pair;
using lumora::tests::passwordSession;
using testing::IsEmpty;
using testing::SizeIs;

namespace {

Array passwordLogin() {
  return {pair("server", "lumora.example.org:8170"), pair("auth", "Password"), pair("user", "alice"),
          pair("pass", "open sesame")};
}

Array kerberosLogin() {
  return {pair("server", "lumora.example.org:8170"), pair("auth", "Kerberos")};
}

// The auxiliary tool is not told how the user authenticates.
Array withoutAuth(Array login) {
  login.erase(login.begin() + 1);
  return login;
}

class CatalogueTest : public lumora::tests::RecordingToolTest, public testing::WithParamInterface<CatalogueEntry> {
protected:
  CatalogueTest() {
    install(entry_.tool);
    auto platform = lumora::Platform::current();
    platform.helperAgent = helperAgent_;
    lumora::Platform::install(platform);
    answer(0, *lumora::xmlDescription(Dictionary{{"answer", 42}}));
  }

  /// Runs the action; what its tool received must be the login and then the entry's words.
  void expectRequest(const std::shared_ptr<LMRSession>& session, const Array& login) {
    std::filesystem::remove_all(folder_ / "data");
    std::filesystem::remove(folder_ / "request");
    const auto action = entry_.make(session, &authorization_);
    action->runSynchronously();
    ASSERT_EQ(action->error(), nullptr) << action->error()->description();
    Array expected = entry_.tool == LMRLumoraActionToolPath && !login.empty() ? withoutAuth(login) : login;
    for (const Value& word : entry_.words) {
      expected.push_back(withWrittenFile(word));
    }
    EXPECT_EQ(request(), *lumora::xmlDescription(expected));
    EXPECT_EQ(commandLine(), (folder_ / "root").string() + entry_.tool + "\n--plistin\n");
    EXPECT_EQ(action->result() != nullptr, entry_.expectsReply);
    EXPECT_THAT(helperAgent_->calls(), IsEmpty());
  }

  /// A word of the table, with the path of the file that was written for it in place of the extension.
  Value withWrittenFile(const Value& word) const {
    const Array* const elements = word.array();
    const std::string* const last = elements ? elements->back().string() : nullptr;
    if (!last || !last->starts_with("*.")) {
      return word;
    }
    for (const auto& file : std::filesystem::recursive_directory_iterator(folder_ / "data")) {
      if (file.path().extension() == last->substr(1)) {
        return pair(*elements->front().string(), file.path().string());
      }
    }
    return word;
  }

  const CatalogueEntry& entry_ = GetParam();
  std::shared_ptr<lumora::fakes::FakeHelperAgent> helperAgent_ = std::make_shared<lumora::fakes::FakeHelperAgent>();
  const lumora::Authorization authorization_{{7, 7, 7}};
};

class ToolCatalogueTest : public CatalogueTest {};
class SessionCatalogueTest : public CatalogueTest {};
class PrivilegedCatalogueTest : public CatalogueTest {};

TEST_P(SessionCatalogueTest, sendsTheLoginAndTheWords_whenTheSessionIsByPassword) {
  expectRequest(passwordSession(), passwordLogin());
}

TEST_P(SessionCatalogueTest, sendsNoUserAndNoPassword_whenTheSessionIsByKerberos) {
  expectRequest(kerberosSession(), kerberosLogin());
}

TEST_P(ToolCatalogueTest, sendsTheWordsAlone_whenThereIsNoSession) {
  expectRequest(nullptr, {});
}

TEST_P(ToolCatalogueTest, saysWhatItDoesAndWhatItExpects) {
  const auto session = entry_.takesSession ? passwordSession() : nullptr;
  const auto action = entry_.make(session, nullptr);
  EXPECT_EQ(action->description(), entry_.progress);
  EXPECT_EQ(action->expectXMLResponse(), entry_.expectsReply);
  EXPECT_EQ(action->session(), session);
  EXPECT_EQ(action->tool(), entry_.tool);
  EXPECT_EQ(action->authorizationRef(), nullptr);
}

TEST_P(PrivilegedCatalogueTest, callsTheHelperAgentAndRunsNoTool) {
  const auto session = entry_.takesSession ? passwordSession() : nullptr;
  const auto action = entry_.make(session, &authorization_);
  action->runSynchronously();
  ASSERT_EQ(action->error(), nullptr);
  ASSERT_THAT(helperAgent_->calls(), SizeIs(1));
  const auto call = helperAgent_->calls().front();
  EXPECT_EQ(call.agent, "org.vantor.lumagentconfigd");
  EXPECT_EQ(call.domain, KTHelperAgentDomainSystem);
  EXPECT_EQ(call.authorization, authorization_.bytes);
  EXPECT_EQ(Value(call.command), entry_.words.front());
  Dictionary expected{{"subarguments", Array(entry_.words.begin() + 1, entry_.words.end())}};
  if (session) {
    expected.set("server", "lumora.example.org:8170");
    expected.set("user", "alice");
    expected.set("pass", "open sesame");
  }
  EXPECT_EQ(call.request, expected);
  EXPECT_FALSE(std::filesystem::exists(folder_ / "request"));
}

TEST_P(PrivilegedCatalogueTest, saysWhatItDoesAndWhatItExpects) {
  const auto session = entry_.takesSession ? passwordSession() : nullptr;
  const auto action = entry_.make(session, &authorization_);
  EXPECT_NE(std::dynamic_pointer_cast<LMRPrivilegedAction>(action), nullptr);
  EXPECT_EQ(action->description(), entry_.progress);
  EXPECT_EQ(action->expectXMLResponse(), entry_.expectsReply);
  EXPECT_EQ(action->session(), session);
  EXPECT_EQ(action->tool(), entry_.tool);
  EXPECT_EQ(action->authorizationRef(), &authorization_);
}

std::vector<CatalogueEntry> entriesWhere(bool (*condition)(const CatalogueEntry&)) {
  std::vector<CatalogueEntry> chosen;
  for (const CatalogueEntry& entry : lumora::tests::catalogue()) {
    if (condition(entry)) {
      chosen.push_back(entry);
    }
  }
  return chosen;
}

std::string nameOf(const testing::TestParamInfo<CatalogueEntry>& info) {
  return info.param.name;
}

INSTANTIATE_TEST_SUITE_P(All, ToolCatalogueTest,
                         testing::ValuesIn(entriesWhere([](const auto& entry) { return !entry.isPrivileged; })),
                         nameOf);
INSTANTIATE_TEST_SUITE_P(All, SessionCatalogueTest, testing::ValuesIn(entriesWhere([](const auto& entry) {
                           return !entry.isPrivileged && entry.takesSession;
                         })),
                         nameOf);
INSTANTIATE_TEST_SUITE_P(All, PrivilegedCatalogueTest,
                         testing::ValuesIn(entriesWhere([](const auto& entry) { return entry.isPrivileged; })), nameOf);

} // namespace
