#include "support/TemporaryFolder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

using Fuzzer = int(const std::uint8_t* bytes, std::size_t size);

extern "C" {
Fuzzer fuzz_archive;
Fuzzer fuzz_movie_file;
Fuzzer fuzz_preferences;
Fuzzer fuzz_property_list;
Fuzzer fuzz_service_text_record;
Fuzzer fuzz_strings_table;
}

namespace {

struct Subject {
  const char* corpus;
  Fuzzer* fuzzer;
};

void PrintTo(const Subject& subject, std::ostream* out) {
  *out << subject.corpus;
}

std::vector<std::string> seedsOf(const std::string& corpus) {
  std::vector<std::string> seeds;
  for (const auto& entry : std::filesystem::directory_iterator(LUMORA_SOURCE_DIR "/fuzz/corpus/" + corpus)) {
    seeds.push_back(lumora::tests::contentOf(entry.path()));
  }
  return seeds;
}

class FuzzSeeds : public testing::TestWithParam<Subject> {
protected:
  static void feed(const std::string& text) {
    GetParam().fuzzer(reinterpret_cast<const std::uint8_t*>(text.data()), text.size());
  }
};

INSTANTIATE_TEST_SUITE_P(All, FuzzSeeds,
                         testing::Values(Subject{"archive", &fuzz_archive}, Subject{"movie-file", &fuzz_movie_file},
                                         Subject{"preferences", &fuzz_preferences},
                                         Subject{"property-list", &fuzz_property_list},
                                         Subject{"service-text-record", &fuzz_service_text_record},
                                         Subject{"strings-table", &fuzz_strings_table}),
                         [](const auto& subject) {
                           std::string name = subject.param.corpus;
                           std::ranges::replace(name, '-', '_');
                           return name;
                         });

// A fuzzer that finds something ends the process.
TEST_P(FuzzSeeds, areHandled_wholeAndCutShort) {
  const auto seeds = seedsOf(GetParam().corpus);
  EXPECT_FALSE(seeds.empty());
  constexpr std::size_t cuts = 100;
  for (const auto& seed : seeds) {
    feed(seed);
    for (std::size_t i = 0; i < cuts; ++i) {
      feed(seed.substr(0, seed.size() * i / cuts));
    }
  }
}

} // namespace
