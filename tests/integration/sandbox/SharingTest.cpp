#include "Requests.h"

#include <LumoraKit/platform/Platform.h>

#include <unistd.h>

using namespace lumora;
using namespace lumora::tests;
using testing::IsEmpty;
using testing::SizeIs;

namespace {

constexpr uid_t nobody = 65534;

class Sharing : public testing::Test {
protected:
  /// As the helper agent asks.
  ProgramRun asAgent(const Array& request) const { return server.request(request, "lumexec"); }
  ProgramRun bind(const std::string& name) const { return asAgent(asUser(server, {"bind", name})); }
  ProgramRun unbind(const std::string& name) const { return asAgent(asUser(server, {"unbind", name})); }
  ProgramRun set(const std::string& keyAndValue) const { return asAgent({"setconfig", keyAndValue}); }

  Dictionary binding() const { return replyTo(server.request({"isbound", "plist"})); }
  Dictionary configuration() const { return replyTo(server.request({"getconfig", "plist"})); }
  Array cameras() const { return *replyTo(server.request(asUser(server, {"listcameras"}))).array("cameras"); }
  ProgramRun camera(const Array& elements) const { return server.request(asUser(server, elements)); }

  SandboxServer server;
};

} // namespace

TEST_F(Sharing, nothingIsShared_whenNothingWasBound) {
  EXPECT_EQ(binding(), (Dictionary{{"Bound", false}}));
  EXPECT_THAT(cameras(), IsEmpty());
  EXPECT_EQ(configuration(), (Dictionary{{"CameraName", ""},
                                         {"TunnelHost", ""},
                                         {"Capture", ""},
                                         {"RecordingVideoInput", ""},
                                         {"RecordingAudioInput", ""},
                                         {"RecordingCapturePreset", ""}}));
}

TEST_F(Sharing, boundCameraIsListedAndRecords) {
  EXPECT_EQ(replyTo(bind("Lectern")).find("Bound")->boolean(), true);
  EXPECT_EQ(binding(), (Dictionary{{"Bound", true}, {"CameraName", "Lectern"}}));
  EXPECT_EQ(configuration().string("CameraName"), "Lectern");
  EXPECT_EQ(configuration().string("TunnelHost"), SandboxServer::host);
  ASSERT_THAT(cameras(), SizeIs(1));
  EXPECT_EQ(cameras().front().dictionary()->string("name"), "Lectern");
  EXPECT_THAT(camera({Array{"start", "Lectern"}, Array{"delay", 0}}), Succeeded());
}

TEST_F(Sharing, unboundCameraIsGone) {
  ASSERT_THAT(bind("Lectern"), Succeeded());
  EXPECT_EQ(replyTo(unbind("Lectern")).find("Bound")->boolean(), false);
  EXPECT_THAT(cameras(), IsEmpty());
  EXPECT_EQ(binding(), (Dictionary{{"Bound", false}}));
}

TEST_F(Sharing, isStatus35_whenTheCameraIsSharedAlready) {
  ASSERT_THAT(bind("Lectern"), Succeeded());
  EXPECT_THAT(bind("Other"), EndedWith(35, "shared as \"Lectern\" already"));
}

TEST_F(Sharing, isStatus35_whenTheServerHasACameraOfThatName) {
  ASSERT_THAT(server.administrate({"camera", "add"}, {"Studio A"}), Succeeded());
  EXPECT_THAT(bind("Studio A"), EndedWith(35, "has a camera named \"Studio A\" already"));
  EXPECT_THAT(unbind("Studio A"), EndedWith(35, "not shared as \"Studio A\""));
}

TEST_F(Sharing, isStatus36_whenTheCameraToUnbindIsRecording) {
  ASSERT_THAT(bind("Lectern"), Succeeded());
  ASSERT_THAT(camera({Array{"start", "Lectern"}, Array{"delay", 0}}), Succeeded());
  EXPECT_THAT(unbind("Lectern"), EndedWith(36, "is recording"));
  EXPECT_THAT(cameras(), SizeIs(1));
}

TEST_F(Sharing, isStatus26_whenTheLoginIsWrong) {
  EXPECT_THAT(asAgent(asUser("ada", "wrong", {"bind", "Lectern"})), EndedWith(26, "wrong user name or password"));
}

TEST_F(Sharing, configurationIsKept) {
  EXPECT_EQ(replyTo(set("Capture=high=best")).string("Capture"), "high=best");
  EXPECT_THAT(set("RecordingVideoInput=Kamera \xC3\xBC"), Succeeded());
  EXPECT_EQ(configuration().string("Capture"), "high=best");
  EXPECT_EQ(configuration().string("RecordingVideoInput"), "Kamera \xC3\xBC");
  ASSERT_THAT(set("Capture="), Succeeded());
  EXPECT_EQ(configuration().string("Capture"), "");
}

TEST_F(Sharing, isStatus12_whenTheConfigurationKeyIsUnknown) {
  for (const auto* text : {"Capture", "capture=x", "=x", "", "Colour=red"}) {
    EXPECT_THAT(set(text), EndedWith(12, "does not begin with a configuration key")) << text;
  }
}

TEST_F(Sharing, isStatus35_whenTheNameIsChangedWhileShared) {
  ASSERT_THAT(bind("Lectern"), Succeeded());
  EXPECT_THAT(set("CameraName=Other"), EndedWith(35, "while the camera is shared"));
  EXPECT_THAT(set("Capture=high"), Succeeded());
}

TEST_F(Sharing, isStatus10_whenTheMainToolIsNotRunByTheSuperuser) {
  std::vector<std::string> command{server.tool().string(), "--plistin"};
  if (geteuid() == 0) {
    // Somebody else's server, and its tool run by its owner.
    for (const auto& entry : std::filesystem::recursive_directory_iterator(server.folder())) {
      ASSERT_EQ(lchown(entry.path().c_str(), nobody, nobody), 0);
    }
    ASSERT_EQ(lchown(server.folder().c_str(), nobody, nobody), 0);
    command.insert(command.begin(),
                   {"setpriv", "--reuid", std::to_string(nobody), "--regid", std::to_string(nobody), "--clear-groups"});
  }
  const auto run = [&](const Array& request) {
    ProgramRun result;
    result.status = Platform::current().toolRunner->run("/usr/bin/env", command, xmlDescription(request).value(),
                                                        result.standardOutput, result.standardError);
    return result;
  };
  if (run({"list_uploads"}).status == 126) {
    GTEST_SKIP() << "the sandbox's program cannot be run by another user here";
  }
  for (const auto& request :
       {Array{"setconfig", "Capture=x"}, asUser(server, {"bind", "Lectern"}), asUser(server, {"unbind", "Lectern"})}) {
    EXPECT_THAT(run(request), EndedWith(10, "is for the superuser"));
  }
  EXPECT_THAT(run({"getconfig", "plist"}), Succeeded());
}
