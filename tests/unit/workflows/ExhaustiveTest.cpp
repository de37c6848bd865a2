// Every workflow of up to three sources, each of any of the four source types and with any folder flag, against a
// model that knows a source as a set of bits.
#include <LumoraKit/workflows/LMRWorkflowAdditions.h>
#include <LumoraKit/workflows/LMRWorkflowAdditionsInternal.h>

#include <gtest/gtest.h>

#include <array>
#include <optional>
#include <utility>
#include <vector>

using lumora::Array;
using lumora::Dictionary;
using lumora::Value;

namespace {

enum Bit : unsigned { Video = 1, Screen = 2, Audio = 4, File = 8, Any = 15 };

const std::array<const char*, 4> words{"Video", "Screen", "Audio", "File"};

struct Flag {
  std::optional<Value> value;
  bool isSet = false;
};

const std::array<Flag, 6> flags{{{std::nullopt, false},
                                 {Value(false), false},
                                 {Value(true), true},
                                 {Value(1), true},
                                 {Value(0), false},
                                 {Value("true"), false}}};

struct Source {
  Dictionary description;
  unsigned types = 0;
  bool isFolder = false;
};

Source makeSource(unsigned types, const Flag& flag) {
  Array sourceTypes;
  for (std::size_t bit = 0; bit < words.size(); ++bit) {
    if ((types >> bit & 1U) != 0) {
      sourceTypes.emplace_back(words.at(bit));
    }
  }
  Dictionary description{{"sourceTypes", std::move(sourceTypes)}};
  if (flag.value) {
    description.set("isFolder", *flag.value);
  }
  return {std::move(description), types, flag.isSet};
}

std::vector<Source> allSources() {
  std::vector<Source> sources;
  for (unsigned types = 0; types <= Any; ++types) {
    for (const Flag& flag : flags) {
      sources.push_back(makeSource(types, flag));
    }
  }
  return sources;
}

using Sources = std::vector<const Source*>;

bool hasFolder(const Sources& sources) {
  bool found = false;
  for (const Source* const source : sources) {
    found = found || source->isFolder;
  }
  return found;
}

bool isSingle(const Sources& sources, unsigned types) {
  return sources.size() == 1 && !sources[0]->isFolder && (sources[0]->types & types) != 0;
}

bool isPair(const Sources& sources, unsigned types) {
  return sources.size() == 2 && !hasFolder(sources) && (sources[0]->types & types) != 0 &&
         (sources[1]->types & types) != 0;
}

int expectedType(const Sources& sources) {
  if (isSingle(sources, Any)) {
    return 1;
  }
  if (isPair(sources, Any)) {
    return 2;
  }
  return sources.size() == 1 && sources[0]->isFolder && (sources[0]->types & File) != 0 ? 3 : 0;
}

bool agrees(const Dictionary& workflow, const Sources& sources) {
  namespace Public = LMRWorkflowAdditions;
  namespace Internal = LMRWorkflowAdditionsInternal;
  return Internal::numberOfSources(workflow) == static_cast<std::int64_t>(sources.size()) &&
         Internal::anySourceRequiresFolderSubmission(workflow) == hasFolder(sources) &&
         Public::acceptsVideo(workflow) == isSingle(sources, Video) &&
         Public::acceptsScreen(workflow) == isSingle(sources, Screen) &&
         Public::acceptsAudio(workflow) == isSingle(sources, Audio) &&
         Public::acceptsDual(workflow) == isPair(sources, Video | Screen) &&
         Public::workflowType(workflow) == expectedType(sources) && Public::supportsFileContentType(workflow, "a/b");
}

// There are 894,049 such workflows, so one is changed in place: each loop swaps its source in and out again.
class ExhaustiveWorkflowTest : public testing::Test {
protected:
  using Counts = std::array<std::size_t, 4>;

  /// Checks all workflows of so many sources; how many there are of each type.
  Counts check(std::size_t count) {
    workflow_.set("sources", Array(count, Dictionary()));
    sources_.assign(count, nullptr);
    checkFrom(0);
    EXPECT_EQ(disagreements_, 0U);
    return types_;
  }

private:
  void checkFrom(std::size_t position) {
    if (position == sources_.size()) {
      disagreements_ += agrees(workflow_, sources_) ? 0U : 1U;
      types_.at(static_cast<std::size_t>(expectedType(sources_))) += 1;
      return;
    }
    Dictionary& place = *(*workflow_.find("sources")->array())[position].dictionary();
    for (Source& source : all_.at(position)) {
      std::swap(place, source.description);
      sources_[position] = &source;
      checkFrom(position + 1);
      std::swap(place, source.description);
    }
  }

  std::array<std::vector<Source>, 3> all_{allSources(), allSources(), allSources()};
  Dictionary workflow_;
  Sources sources_;
  std::size_t disagreements_ = 0;
  Counts types_{};
};

TEST_F(ExhaustiveWorkflowTest, agreesWithTheModel_whenThereIsNoSource) {
  EXPECT_EQ(check(0), (Counts{1, 0, 0, 0}));
  EXPECT_TRUE(agrees({}, {}));
}

// 15 sets of types without a folder by 4 flags; 8 sets with "File" by 2 flags.
TEST_F(ExhaustiveWorkflowTest, agreesWithTheModel_whenThereIsOneSource) {
  EXPECT_EQ(check(1), (Counts{20, 60, 0, 16}));
}

TEST_F(ExhaustiveWorkflowTest, agreesWithTheModel_whenThereAreTwoSources) {
  EXPECT_EQ(check(2), (Counts{9'216 - 3'600, 0, 3'600, 0}));
}

TEST_F(ExhaustiveWorkflowTest, agreesWithTheModel_whenThereAreThreeSources) {
  EXPECT_EQ(check(3), (Counts{884'736, 0, 0, 0}));
}

} // namespace
