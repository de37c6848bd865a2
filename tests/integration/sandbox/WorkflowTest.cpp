#include "Requests.h"

using namespace lumora;
using namespace lumora::tests;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

Array sources(const Array& types) {
  return Array(1, Value(Dictionary{{"sourceTypes", types}}));
}

const Dictionary lectures{{"name", "lectures"}, {"title", "Lectures"}, {"sources", sources({"Video", "File"})}};

Dictionary with(Dictionary package, const char* key, const Value& value) {
  package.set(key, value);
  return package;
}

Dictionary without(Dictionary package, const char* key) {
  package.remove(key);
  return package;
}

/// The one element. (In braces it would be a copy of the array.)
Array masterPassword(const char* password) {
  return Array(1, Value(Array{"master_password", password}));
}

class Workflows : public testing::Test {
protected:
  ProgramRun request(const Array& elements) const { return server.request(asUser(server, elements)); }
  std::filesystem::path write(const std::string& text) const { return writeFile(path, text); }
  /// Installs a package with further elements behind its path.
  ProgramRun installText(const std::string& text, const Array& more = {}) const {
    Array elements{"installworkflow", pair("path", write(text))};
    elements.insert(elements.end(), more.begin(), more.end());
    return request(elements);
  }
  ProgramRun install(const Dictionary& package, const Array& more = {}) const {
    return installText(xmlDescription(package).value(), more);
  }
  ProgramRun download(const std::string& uuid, const std::filesystem::path& target) const {
    return request({"downloadworkflow", Array{"workflow_uuid", uuid}, pair("path", target)});
  }
  ProgramRun remove(const std::string& uuid) const { return request({"deleteworkflow", Array{"workflow_uuid", uuid}}); }
  Dictionary info(const std::string& uuid) const {
    return replyTo(request({"infoworkflow", Array{"workflow_uuid", uuid}}));
  }
  void setMasterPassword() const {
    ASSERT_THAT(server.administrate({"master-password"}, {}, "open sesame\n"), Succeeded());
  }
  /// Whatever is in the folder but the package.
  std::vector<std::filesystem::path> otherFiles() const {
    std::vector<std::filesystem::path> all;
    for (const auto& entry : std::filesystem::directory_iterator(server.folder())) {
      if (entry.path() != path && entry.path() != server.root()) {
        all.push_back(entry.path());
      }
    }
    return all;
  }

  SandboxServer server;
  std::filesystem::path path = server.folder() / "package.plist";
  const Dictionary locked = with(lectures, "protected", true);
};

} // namespace

TEST_F(Workflows, installedOneIsDescribedAndListed) {
  const auto reply = replyTo(install(lectures));
  const auto uuid = reply.string("uuid").value_or("");
  EXPECT_EQ(server.workflowUUID("lectures"), uuid);
  const auto described = info(uuid);
  EXPECT_EQ(described, reply);
  EXPECT_EQ(described.string("title"), "Lectures");
  EXPECT_EQ(described.find("protected")->boolean(), false);
  EXPECT_EQ(*described.array("sources"),
            Array(1, Value(Dictionary{{"sourceTypes", Array{"Video", "File"}}, {"isFolder", false}})));
}

TEST_F(Workflows, titleIsTheName_whenThePackageHasNone) {
  EXPECT_EQ(replyTo(install(without(lectures, "title"))).string("title"), "lectures");
}

TEST_F(Workflows, isStatus12_whenTheNameIsTakenAndNotToBeOverwritten) {
  ASSERT_THAT(install(lectures), Succeeded());
  EXPECT_THAT(install(with(lectures, "title", "Other")), EndedWith(12, "named \"lectures\" already"));
  EXPECT_EQ(info(server.workflowUUID("lectures")).string("title"), "Lectures");
}

TEST_F(Workflows, keepsItsUUID_whenOverwritten) {
  const auto uuid = replyTo(install(lectures)).string("uuid").value_or("");
  const auto reply = replyTo(install(with(lectures, "sources", sources({"Audio"})), {"overwrite"}));
  EXPECT_EQ(reply.string("uuid"), uuid);
  EXPECT_EQ(info(uuid).array("sources")->front().dictionary()->array("sourceTypes")->front(), Value("Audio"));
}

TEST_F(Workflows, isInstalled_whenOverwriteWasAskedForAndThereWasNone) {
  EXPECT_THAT(install(lectures, {"overwrite"}), Succeeded());
}

TEST_F(Workflows, isStatus33_whenThePackageCannotBeRead) {
  EXPECT_THAT(request({"installworkflow", pair("path", server.folder() / "missing")}), EndedWith(33, "cannot be read"));
  EXPECT_THAT(request({"installworkflow", pair("path", server.folder())}), EndedWith(33, "cannot be read"));
}

TEST_F(Workflows, isStatus11_whenItIsNoPackage) {
  for (const auto* text : {"", "PK\003\004", "<plist version=\"1.0\"><array/></plist>"}) {
    EXPECT_THAT(installText(text), EndedWith(11, "no workflow package")) << text;
  }
}

TEST_F(Workflows, isStatus11_whenAKeyIsMissingUnknownOrWrong) {
  const std::vector<std::pair<Dictionary, const char*>> wrong{
      {without(lectures, "name"), "\"name\" is missing"},
      {with(lectures, "name", ""), "\"name\" is missing, empty"},
      {with(lectures, "name", 5), "\"name\" is missing, empty or not a string"},
      {with(lectures, "title", ""), "\"title\" is missing, empty"},
      {with(lectures, "uuid", "x"), "the key \"uuid\" is unknown"},
      {with(lectures, "protected", "yes"), "\"protected\" is not a boolean"},
      {without(lectures, "sources"), "\"sources\" is missing"},
      {with(lectures, "sources", Array{}), "\"sources\" is missing, empty"},
      {with(lectures, "sources", "Video"), "\"sources\" is missing"},
      {with(lectures, "sources", Array{"Video"}), "holds what is no source"},
      {with(lectures, "sources", sources({})), "holds what is no source"},
      {with(lectures, "sources", sources({"video"})), "holds what is no source"},
      {with(lectures, "sources", sources({5})), "holds what is no source"},
      {with(lectures, "sources", Array(1, Value(Dictionary{{"sourceTypes", Array{"File"}}, {"isFolder", "yes"}}))),
       "holds what is no source"}};
  for (const auto& [package, reason] : wrong) {
    EXPECT_THAT(install(package), EndedWith(11, reason)) << reason;
  }
}

TEST_F(Workflows, protectedOneIsInstalled_whenTheMasterPasswordIsRight) {
  setMasterPassword();
  const auto reply = replyTo(install(locked, masterPassword("open sesame")));
  EXPECT_EQ(reply.find("protected")->boolean(), true);
}

TEST_F(Workflows, isStatus26_whenTheMasterPasswordIsMissingOrWrong) {
  EXPECT_THAT(install(locked, masterPassword("x")), EndedWith(26, "this server has no master password"));
  setMasterPassword();
  EXPECT_THAT(install(locked), EndedWith(26, "the master password is needed"));
  EXPECT_THAT(install(locked, masterPassword("x")), EndedWith(26, "the master password is wrong"));
  EXPECT_THAT(install(lectures, masterPassword("x")), EndedWith(26, "the master password is wrong"));
  EXPECT_THAT(install(lectures), Succeeded());
}

TEST_F(Workflows, auxiliaryToolNeedsTheMasterPassword_whenTheWorkflowIsProtected) {
  setMasterPassword();
  ASSERT_THAT(install(locked, masterPassword("open sesame")), Succeeded());
  const auto submit = [&](const Array& password) {
    Array elements{Array{"server", "localhost:8170"},
                   Array{"user", SandboxServer::userName},
                   Array{"pass", SandboxServer::password},
                   Array{"subcommand", "workflow"},
                   Array{"workflow", "lectures"},
                   pair("metadata", writeMetadata(server)),
                   Array{"basedir", "/tmp"}};
    elements.insert(elements.end(), password.begin(), password.end());
    elements.emplace_back(pair("input", path));
    return server.request(elements, "lumaction");
  };
  EXPECT_THAT(submit({}), EndedWith(26, "the master password is needed"));
  EXPECT_THAT(submit(masterPassword("x")), EndedWith(26, "the master password is wrong"));
  EXPECT_THAT(submit(masterPassword("open sesame")), Succeeded());
}

TEST_F(Workflows, masterPasswordIsKeptAsAHashOnly) {
  setMasterPassword();
  for (const auto& entry : std::filesystem::recursive_directory_iterator(server.root() / "var")) {
    if (entry.is_regular_file()) {
      EXPECT_THAT(contentOf(entry.path()), Not(HasSubstr("open sesame"))) << entry.path();
    }
  }
}

TEST_F(Workflows, downloadedOneCanBeInstalledAgain) {
  setMasterPassword();
  const Array password = masterPassword("open sesame");
  const auto installed = replyTo(install(locked, password));
  const auto target = writeFile(server.folder() / "downloaded.plist", "what was there before");
  const auto uuid = installed.string("uuid").value_or("");
  EXPECT_EQ(replyTo(download(uuid, target)).string("path"), target.string());
  ASSERT_THAT(remove(uuid), Succeeded());
  const auto again = replyTo(installText(contentOf(target), password));
  EXPECT_EQ(again.array("sources")->front(), installed.array("sources")->front());
  EXPECT_EQ(again.string("title"), "Lectures");
  EXPECT_EQ(again.find("protected")->boolean(), true);
  EXPECT_THAT(otherFiles(), testing::ElementsAre(target));
}

TEST_F(Workflows, isStatus33AndLeavesNothing_whenItCannotBeDownloaded) {
  const auto uuid = server.workflowUUID("single-video");
  EXPECT_THAT(download(uuid, server.folder() / "missing/w.plist"), EndedWith(33, "cannot be written"));
  const auto folder = server.folder() / "folder";
  std::filesystem::create_directories(folder / "inner");
  EXPECT_THAT(download(uuid, folder), EndedWith(33, "directory"));
  EXPECT_THAT(otherFiles(), testing::ElementsAre(folder));
}

TEST_F(Workflows, deletedOneIsGoneAndItsEpisodesStay) {
  const auto uuid = server.workflowUUID("single-video");
  const auto file = writeFile(server.folder() / "movie.mov", "abc");
  ASSERT_THAT(request({"submit", pair("file", file), pair("metadata", writeMetadata(server)),
                       Array{"workflow", "single-video"}}),
              Succeeded());
  EXPECT_EQ(replyTo(remove(uuid)).string("name"), "single-video");
  EXPECT_THAT(remove(uuid), EndedWith(12, "no workflow with the UUID"));
  EXPECT_THAT(server.episodes(), testing::SizeIs(1));
}

TEST_F(Workflows, isStatus12_whenTheUUIDIsUnknown) {
  EXPECT_THAT(remove("single-video"), EndedWith(12, "no workflow with the UUID"));
  EXPECT_THAT(download("none", server.folder() / "w.plist"), EndedWith(12, "no workflow with the UUID"));
  EXPECT_THAT(otherFiles(), IsEmpty());
}

TEST_F(Workflows, oneInstallationSucceeds_whenManyInstallItAtOnce) {
  write(xmlDescription(lectures).value());
  std::vector<int> statuses(8);
  std::vector<std::thread> threads;
  for (auto& status : statuses) {
    threads.emplace_back([&] { status = request({"installworkflow", pair("path", path)}).status; });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(std::count(statuses.begin(), statuses.end(), 0), 1);
  EXPECT_EQ(std::count(statuses.begin(), statuses.end(), 12), 7);
}
