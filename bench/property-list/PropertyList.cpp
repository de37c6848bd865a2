#include "support/Figures.h"

#include <LumoraKit/platform/PropertyList.h>

#include <benchmark/benchmark.h>
#include <expat.h>

#include <cstdlib>
#include <vector>

#include <libxml/parser.h>

/// \file
/// Reading and writing a workflow list of 20 MB, as a large server answers it, against the bare parser and
/// libxml2's tree of nodes.

namespace lumora {
namespace {

constexpr std::size_t listSize = 20'000'000;

Dictionary source(int number) {
  Array types{"Video", "Screen", "Audio", "File"};
  types.resize(static_cast<std::size_t>(1 + number % 4), Value(false));
  return {
      {"sourceTypes", std::move(types)}, {"isFolder", number % 7 == 0}, {"minimum", 1}, {"maximum", number % 3 + 1}};
}

std::string uuid(int number) {
  const std::string digits = std::to_string(100'000 + number);
  return "6F9619FF-8B86-D011-B42D-00C04F" + digits;
}

Dictionary workflow(int number) {
  const std::string name = "Lecture Capture " + std::to_string(number);
  return {{"name", name},
          {"title", name + ": camera & slides, \u00e9dition publique"},
          {"uuid", uuid(number)},
          {"sources", Array{source(number), source(number + 1)}},
          {"modified", Date(std::chrono::seconds(1'264'000'000 + number))},
          {"description", "Records the lecturer and the slides, and publishes the episode when it has been approved."}};
}

// Grows by a tenth at a time until its text is large enough.
std::string workflowList() {
  Array workflows;
  std::string text;
  for (int count = 10'000; text.size() < listSize; count += count / 10) {
    for (int number = static_cast<int>(workflows.size()); number < count; ++number) {
      workflows.emplace_back(workflow(number));
    }
    text = xmlDescription(Dictionary{{"workflows", workflows}}).value();
  }
  return text;
}

const std::string& list() {
  static const std::string text = workflowList();
  return text;
}

void setBytes(benchmark::State& state) {
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(list().size()));
}

void bareExpat(benchmark::State& state) {
  const std::string& text = list();
  for ([[maybe_unused]] auto round : state) {
    XML_Parser parser = XML_ParserCreate(nullptr);
    XML_SetElementHandler(
        parser, [](void*, const XML_Char*, const XML_Char**) {}, [](void*, const XML_Char*) {});
    XML_SetCharacterDataHandler(parser, [](void*, const XML_Char*, int) {});
    if (XML_Parse(parser, text.data(), static_cast<int>(text.size()), XML_TRUE) != XML_STATUS_OK) {
      state.SkipWithError("the parser refused the list");
    }
    XML_ParserFree(parser);
  }
  setBytes(state);
}

// The values are destroyed outside the measured time; readAndDestroy shows what that costs.
void read(benchmark::State& state) {
  const std::string& text = list();
  for ([[maybe_unused]] auto round : state) {
    std::optional<Dictionary> dictionary = dictionaryWithXMLDescription(text);
    if (!dictionary) {
      state.SkipWithError("the reader refused the list");
    }
    state.PauseTiming();
    dictionary.reset();
    state.ResumeTiming();
  }
  setBytes(state);
}

void readAndDestroy(benchmark::State& state) {
  const std::string& text = list();
  for ([[maybe_unused]] auto round : state) {
    if (!dictionaryWithXMLDescription(text)) {
      state.SkipWithError("the reader refused the list");
    }
  }
  setBytes(state);
}

void documentTree(benchmark::State& state) {
  const std::string& text = list();
  for ([[maybe_unused]] auto round : state) {
    xmlDoc* const document =
        xmlReadMemory(text.data(), static_cast<int>(text.size()), nullptr, nullptr, XML_PARSE_HUGE);
    if (document == nullptr) {
      state.SkipWithError("the document was refused");
    }
    xmlFreeDoc(document);
  }
  setBytes(state);
}

void write(benchmark::State& state) {
  const Dictionary dictionary = dictionaryWithXMLDescription(list()).value();
  for ([[maybe_unused]] auto round : state) {
    if (xmlDescription(dictionary).value().size() != list().size()) {
      state.SkipWithError("the list was not written as it was read");
    }
  }
  setBytes(state);
}

void severalTimes(benchmark::internal::Benchmark* one) {
  one->Repetitions(7)->ReportAggregatesOnly()->Unit(benchmark::kMillisecond);
}

BENCHMARK(bareExpat)->Apply(severalTimes);
BENCHMARK(read)->Apply(severalTimes);
BENCHMARK(readAndDestroy)->Apply(severalTimes);
BENCHMARK(documentTree)->Apply(severalTimes);
BENCHMARK(write)->Apply(severalTimes);

} // namespace
} // namespace lumora

int main(int argc, char** argv) {
  using namespace lumora::bench;
  // Rounds of all are mixed, so that a busy moment of the machine does not fall on one of them alone.
  std::vector<char*> arguments(argv, argv + argc);
  std::string mixed = "--benchmark_enable_random_interleaving=true";
  arguments.insert(arguments.begin() + 1, mixed.data());
  const auto seconds = runBenchmarks(argc + 1, arguments.data());
  bool reached = report("property-list read of 20 MB against bare Expat", seconds.at("read") / seconds.at("bareExpat"),
                        Bar::AtMost, 1.6);
  reached &= report("property-list write of 20 MB against its read", seconds.at("write") / seconds.at("read"),
                    Bar::AtMost, 0.5);
  tell("property-list read and its values' end against libxml2's tree of nodes and its end",
       seconds.at("readAndDestroy") / seconds.at("documentTree"));
  return reached ? EXIT_SUCCESS : EXIT_FAILURE;
}
