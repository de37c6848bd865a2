#include "Requests.h"

using namespace lumora;
using namespace lumora::tests;
using testing::SizeIs;

namespace {

constexpr std::size_t mebibyte = std::size_t{1024} * 1024;

struct OddName {
  const char* what;
  std::string name;
};

void PrintTo(const OddName& name, std::ostream* stream) {
  *stream << name.what;
}

/// Of a camera; the movie that it files is named after it.
class OddCameraName : public testing::TestWithParam<OddName> {
protected:
  ProgramRun asUserOf(const Array& elements, const char* tool = "lumctl") const {
    return server.request(asUser(server, elements), tool);
  }

  SandboxServer server;
};

} // namespace

TEST_P(OddCameraName, isTakenAsItIs) {
  const std::string& name = GetParam().name;
  ASSERT_THAT(asUserOf({"bind", name}, "lumexec"), Succeeded());
  const auto cameras = replyTo(asUserOf({"listcameras"}));
  EXPECT_EQ(cameras.array("cameras")->front().dictionary()->string("name"), name);
  ASSERT_THAT(asUserOf({Array{"start", name}, Array{"delay", 0}}), Succeeded());
  ASSERT_THAT(
      asUserOf({Array{"stop", name}, pair("metadata", writeMetadata(server)), Array{"workflow", "single-video"}}),
      Succeeded());
  ASSERT_THAT(server.episodes(), SizeIs(1));
  const auto episode = server.episodes().front();
  const auto& file = *episode.array("files")->front().dictionary();
  EXPECT_TRUE(std::filesystem::is_regular_file(file.string("path").value()));
  EXPECT_EQ(std::filesystem::path(file.string("path").value()).parent_path().parent_path(),
            server.root() / "var/lib/lumora/submissions");
  EXPECT_THAT(asUserOf({"unbind", name}, "lumexec"), Succeeded());
}

TEST_P(OddCameraName, isNamedInTheRefusal_whenThereIsNoSuchCamera) {
  EXPECT_THAT(asUserOf(Array(1, Value(Array{"status", GetParam().name}))), EndedWith(36, '"' + GetParam().name + '"'));
}

INSTANTIATE_TEST_SUITE_P(Odd, OddCameraName,
                         testing::Values(OddName{"quotes", "\"double\" and 'single' <tag> &amp;"},
                                         OddName{"newLines", "two\nlines"}, OddName{"emoji", "講義 🎥"},
                                         OddName{"aSpace", " "}, OddName{"aPath", "../../../etc/passwd"},
                                         OddName{"aMebibyte", std::string(mebibyte, 'x')}),
                         [](const auto& parameter) { return parameter.param.what; });

TEST(OddName, isStatus12_whenACameraIsToHaveNone) {
  const SandboxServer server;
  EXPECT_THAT(server.request(asUser(server, {"bind", ""}), "lumexec"), EndedWith(12, "name is empty"));
  EXPECT_THAT(server.administrate({"camera", "add"}, {""}), EndedWith(1, "name is empty"));
}

TEST(OddName, ofAFileIsKept_whenNoLongerOneCouldBe) {
  const SandboxServer server;
  std::string name = "é";
  while (name.size() < 250) {
    name += "é";
  }
  name += ".mov";
  const auto file = writeFile(server.folder() / name, "a movie");
  ASSERT_THAT(server.request(asUser(server, {"submit", pair("file", file), pair("metadata", writeMetadata(server)),
                                             Array{"workflow", "single-video"}})),
              Succeeded());
  const auto episode = server.episodes().front();
  const auto& stored = *episode.array("files")->front().dictionary();
  EXPECT_EQ(stored.string("name"), name);
  EXPECT_EQ(contentOf(stored.string("path").value()), "a movie");
}

TEST(OddName, ofAWorkflowIsUnknown_whenItIsAMebibyteLong) {
  const SandboxServer server;
  const std::string name(mebibyte, 'x');
  EXPECT_THAT(server.request(asUser(server, {"infoworkflow", Array{"workflow_uuid", name}})),
              EndedWith(12, "no workflow with the UUID"));
  EXPECT_THAT(server.request(asUser(server, {"submit", pair("file", writeMetadata(server)),
                                             pair("metadata", writeMetadata(server)), Array{"workflow", name}})),
              EndedWith(30, ""));
}
