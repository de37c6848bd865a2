#include <LumoraKit/platform/KeyedArchive.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>

#include <gtest/gtest.h>

using namespace lumora;

namespace {

class Tree final : public Archivable {
public:
  explicit Tree(std::optional<std::string> treeName) : name(std::move(treeName)) {}

  std::string className() const override { return kind; }

  void encodeWithCoder(KeyedArchiver& coder) const override {
    if (name) {
      coder.encode("name", "overwritten");
      coder.encode("name", *name);
    }
    coder.encodeObjects("branches", {branches.begin(), branches.end()});
  }

  static std::shared_ptr<Archivable> decode(KeyedUnarchiver& coder) {
    auto tree = std::make_shared<Tree>(coder.decodeString("name"));
    for (const auto& branch : coder.decodeObjects("branches")) {
      tree->branches.push_back(std::dynamic_pointer_cast<Tree>(branch));
    }
    return tree->name == "refused" ? nullptr : tree;
  }

  std::string kind = "Tree";
  std::optional<std::string> name;
  std::vector<std::shared_ptr<Tree>> branches;
};

const KeyedUnarchiver::ClassTable classes{{"Tree", &Tree::decode}};

std::shared_ptr<Tree> roundTrip(const Tree& tree) {
  LMRErrorRef error;
  const auto object = KeyedUnarchiver::unarchivedObject(KeyedArchiver::archivedData(tree), classes, &error);
  EXPECT_EQ(error, nullptr) << text(error);
  return std::dynamic_pointer_cast<Tree>(object);
}

TEST(KeyedArchive, isAPropertyListOfClassAndKeys_whenWritten) {
  Tree tree("oak");
  tree.branches.push_back(std::make_shared<Tree>(std::nullopt));
  const auto list = valueWithXMLDescription(KeyedArchiver::archivedData(tree));
  ASSERT_TRUE(list);
  EXPECT_EQ(list->description(), "{class: Tree, keys: {name: oak, branches: [{class: Tree, keys: {branches: []}}]}}");
}

TEST(KeyedArchive, givesTheObjectBack_whenItsClassIsKnown) {
  Tree tree("oak");
  tree.branches = {std::make_shared<Tree>("left"), std::make_shared<Tree>(std::nullopt)};
  tree.branches[0]->branches = {std::make_shared<Tree>("leaf")};
  const auto decoded = roundTrip(tree);
  ASSERT_NE(decoded, nullptr);
  EXPECT_EQ(decoded->name, "oak");
  ASSERT_EQ(decoded->branches.size(), 2U);
  EXPECT_EQ(decoded->branches[0]->name, "left");
  EXPECT_EQ(decoded->branches[0]->branches.at(0)->name, "leaf");
  EXPECT_EQ(decoded->branches[1]->name, std::nullopt);
}

TEST(KeyedArchive, leavesObjectsOut_whenTheirClassRefusesOrIsUnknown) {
  Tree tree("oak");
  tree.branches = {std::make_shared<Tree>("a"), std::make_shared<Tree>("refused"), std::make_shared<Tree>("b")};
  tree.branches[2]->kind = "Bush";
  const auto decoded = roundTrip(tree);
  ASSERT_NE(decoded, nullptr);
  ASSERT_EQ(decoded->branches.size(), 1U);
  EXPECT_EQ(decoded->branches[0]->name, "a");
}

TEST(KeyedArchive, givesNullWithoutAnError_whenTheClassRefuses) {
  LMRErrorRef error = LMRError::make("old", 1, "old");
  const std::string archive = KeyedArchiver::archivedData(Tree("refused"));
  EXPECT_EQ(KeyedUnarchiver::unarchivedObject(archive, classes, &error), nullptr);
  EXPECT_EQ(error, nullptr);
}

TEST(KeyedArchive, givesTheReadersError_whenTheTextIsNoPropertyList) {
  for (const std::string_view archive : {"", "text", "<plist><array/></plist>", "<plist><dict>"}) {
    LMRErrorRef error;
    EXPECT_EQ(KeyedUnarchiver::unarchivedObject(archive, classes, &error), nullptr);
    ASSERT_NE(error, nullptr);
    EXPECT_EQ(error->domain(), PropertyListErrorDomain);
  }
}

void expectRefused(const Dictionary& list, KeyedArchiveError code) {
  LMRErrorRef error;
  const std::string archive = xmlDescription(list).value();
  EXPECT_EQ(KeyedUnarchiver::unarchivedObject(archive, classes, &error), nullptr);
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), KeyedArchiveErrorDomain);
  EXPECT_EQ(error->code(), static_cast<std::int64_t>(code));
  EXPECT_EQ(KeyedUnarchiver::unarchivedObject(archive, classes), nullptr);
}

TEST(KeyedArchive, givesAnError_whenThePropertyListIsNoArchive) {
  expectRefused({}, KeyedArchiveError::NotAnArchive);
  expectRefused({{"class", "Tree"}}, KeyedArchiveError::NotAnArchive);
  expectRefused({{"keys", Dictionary{}}}, KeyedArchiveError::NotAnArchive);
  expectRefused({{"class", 1}, {"keys", Dictionary{}}}, KeyedArchiveError::NotAnArchive);
  expectRefused({{"class", "Tree"}, {"keys", Array{}}}, KeyedArchiveError::NotAnArchive);
}

TEST(KeyedArchive, givesAnError_whenTheClassIsUnknown) {
  expectRefused({{"class", "Bush"}, {"keys", Dictionary{}}}, KeyedArchiveError::UnknownClass);
}

TEST(KeyedArchive, givesNothingForAKey_whenItIsOfAnotherType) {
  const Dictionary list{{"class", "Tree"}, {"keys", Dictionary{{"name", 1}, {"branches", "text"}}}};
  const auto tree =
      std::dynamic_pointer_cast<Tree>(KeyedUnarchiver::unarchivedObject(xmlDescription(list).value(), classes));
  ASSERT_NE(tree, nullptr);
  EXPECT_EQ(tree->name, std::nullopt);
  EXPECT_TRUE(tree->branches.empty());
}

TEST(KeyedArchive, leavesOutWhatIsNoObject_whenDecodingObjects) {
  const Dictionary list{{"class", "Tree"}, {"keys", Dictionary{{"branches", Array{1, "text", Dictionary{}}}}}};
  const auto tree =
      std::dynamic_pointer_cast<Tree>(KeyedUnarchiver::unarchivedObject(xmlDescription(list).value(), classes));
  ASSERT_NE(tree, nullptr);
  EXPECT_TRUE(tree->branches.empty());
}

TEST(KeyedArchive, isEmptyWithAnError_whenXMLCannotCarryAText) {
  LMRErrorRef error;
  EXPECT_EQ(KeyedArchiver::archivedData(Tree("\x01"), &error), "");
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), PropertyListErrorDomain);
}

TEST(KeyedArchive, stopsDecoding_whenObjectsAreNestedWithoutEnd) {
  Value object = Dictionary{{"class", "Tree"}, {"keys", Dictionary{}}};
  for (int depth = 1; depth < 3000; ++depth) {
    Array branches;
    branches.push_back(std::move(object));
    Dictionary keys;
    keys.set("branches", std::move(branches));
    Dictionary outer{{"class", "Tree"}};
    outer.set("keys", std::move(keys));
    object = std::move(outer);
  }
  auto tree =
      std::dynamic_pointer_cast<Tree>(KeyedUnarchiver::unarchivedObject(xmlDescription(object).value(), classes));
  int levels = 0;
  for (; tree; ++levels) {
    tree = tree->branches.empty() ? nullptr : tree->branches[0];
  }
  EXPECT_EQ(levels, 100);
}

} // namespace
