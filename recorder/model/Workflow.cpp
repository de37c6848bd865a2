#include "recorder/model/Workflow.h"

#include <algorithm>

namespace recorder {
namespace {

Place placeOfSingleSource(const lumora::Dictionary& description) {
  Place place;
  if (LMRWorkflowAdditions::acceptsVideo(description)) {
    place.kinds = {SourceKind::Camera, SourceKind::RemoteCamera};
  }
  if (LMRWorkflowAdditions::acceptsScreen(description)) {
    place.kinds.push_back(SourceKind::Screen);
  }
  if (LMRWorkflowAdditions::acceptsAudio(description)) {
    place.kinds.push_back(SourceKind::Microphone);
  }
  return place;
}

// A source of a workflow that takes two says which of a camera and a screen it takes.
Place placeOfOneOfTwo(const lumora::Dictionary& source) {
  Place place;
  const lumora::Array* const types = source.array("sourceTypes");
  for (const lumora::Value& type : types ? *types : lumora::Array()) {
    if (type == lumora::Value("Video")) {
      place.kinds.insert(place.kinds.end(), {SourceKind::Camera, SourceKind::RemoteCamera});
    } else if (type == lumora::Value("Screen")) {
      place.kinds.push_back(SourceKind::Screen);
    }
  }
  return place;
}

std::vector<Place> placesOf(const lumora::Dictionary& description) {
  if (!LMRWorkflowAdditions::acceptsDual(description)) {
    return {placeOfSingleSource(description)};
  }
  std::vector<Place> places;
  for (const lumora::Value& source : *description.array(LMRWorkflowSourcesKey)) {
    places.push_back(placeOfOneOfTwo(*source.dictionary()));
  }
  return places;
}

bool feed(const std::vector<Place>& places, const SourceDescriptions& sources, std::vector<std::size_t>& chosen) {
  if (chosen.size() == places.size()) {
    return true;
  }
  const Place& place = places[chosen.size()];
  for (std::size_t i = 0; i < sources.size(); ++i) {
    if (place.takes(sources[i].kind) && std::ranges::count(chosen, i) == 0) {
      chosen.push_back(i);
      if (feed(places, sources, chosen)) {
        return true;
      }
      chosen.pop_back();
    }
  }
  return false;
}

} // namespace

bool Place::takes(SourceKind kind) const {
  return std::ranges::count(kinds, kind) != 0;
}

std::optional<Workflow> Workflow::withDescription(const lumora::Dictionary& description) {
  Workflow workflow{.title = description.string(LMRWorkflowTitleKey).value_or(""),
                    .uuid = description.string(LMRWorkflowUUIDKey).value_or(""),
                    .places = placesOf(description)};
  const bool isUseful = !workflow.uuid.empty() &&
                        std::ranges::none_of(workflow.places, [](const Place& each) { return each.kinds.empty(); });
  return isUseful ? std::optional(std::move(workflow)) : std::nullopt;
}

std::optional<std::vector<std::size_t>> Workflow::fed(const SourceDescriptions& sources) const {
  std::vector<std::size_t> chosen;
  return feed(places, sources, chosen) ? std::optional(std::move(chosen)) : std::nullopt;
}

} // namespace recorder
